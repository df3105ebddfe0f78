#include <korvex-compat/XmlNode.h>

#include <libxml/tree.h>

#include <new>
#include <utility>

namespace xml {
inline namespace korvex_compat {

namespace {

const xmlChar* toXml(const char* s) {
    return reinterpret_cast<const xmlChar*>(s);
}

template <class T>
T* checked(T* p) {
    if (p == nullptr) throw std::bad_alloc();
    return p;
}

}  // namespace

node::node() : node("blank") {}

node::node(const char* name) : _node(checked(xmlNewNode(nullptr, toXml(name)))) {}

node::node(const char* name, const char* content) : node(name) {
    set_content(content);
}

node::node(const node& other) : _node(checked(xmlCopyNode(other._node, 1))) {}

node& node::operator=(const node& other) {
    node copy(other);
    swap(copy);
    return *this;
}

node::~node() {
    xmlFreeNode(_node);
    xmlFree(_content);
}

void node::swap(node& other) noexcept {
    std::swap(_node, other._node);
    std::swap(_content, other._content);
}

void node::set_name(const char* name) {
    xmlNodeSetName(_node, toXml(name));
}

const char* node::get_name() const {
    return reinterpret_cast<const char*>(_node->name);
}

// xmlNodeSetContent would take "&" for the start of an entity; adding takes the text as it stands.
void node::set_content(const char* content) {
    xmlNodeSetContent(_node, nullptr);
    xmlNodeAddContent(_node, toXml(content));
}

const char* node::get_content() const {
    xmlFree(_content);
    _content = xmlNodeGetContent(_node);
    return _content != nullptr ? reinterpret_cast<const char*>(_content) : "";
}

}  // namespace korvex_compat
}  // namespace xml
