// Uses xmlwrapp, and a Korvex that was built without it.
#include <korvex/util/LoaderInfo.h>
#include <xmlwrapp/node.h>

#include <cstdio>
#include <type_traits>

void setByShortName();

static_assert(!std::is_same_v<xml::node, korvex::XmlNode>);

int main() {
    const xml::node theirs("theirs");
    std::puts(theirs.get_name());
    setByShortName();
    korvex::LoaderInfo& info = *korvex::LoaderInfo::getInstance();
    std::puts(info.getCommonComponentNode().get_name());
    info.setCommonComponentNode(korvex::XmlNode("long"));
    std::puts(info.getCommonComponentNode().get_name());
}
