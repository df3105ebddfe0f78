// Knows xml::node from Korvex.
#undef KORVEX_QUALIFIED_NAMES
#include <korvex/util/LoaderInfo.h>

void setByShortName() {
    LoaderInfo::getInstance()->setCommonComponentNode(xml::node("short"));
}
