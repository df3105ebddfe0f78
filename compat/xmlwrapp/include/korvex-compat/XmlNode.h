#pragma once

// Stands in for xmlwrapp's node where Korvex is built without that library: the part of it that
// Korvex uses, over the real libxml2. This folder is on the include path only then. The inner
// namespace keeps the two apart in a program that links both. One that includes both in one file
// defines KORVEX_QUALIFIED_NAMES: xml::node is xmlwrapp's there, korvex::XmlNode is this one.

#include <korvex/Export.h>

struct _xmlNode;

namespace xml {
KORVEX_NAMESPACE(korvex_compat) {

// One XML element: a name and its text. A value; copies are deep. Names and contents are
// NUL-terminated UTF-8 and are copied. Running out of memory throws std::bad_alloc. As thread-safe
// as a std::string, but for get_content().
class node {
  public:
    // An element named "blank".
    node();
    explicit node(const char* name);
    node(const char* name, const char* content);
    node(const node& other);
    node& operator=(const node& other);
    ~node();

    void swap(node& other) noexcept;

    void set_name(const char* name);
    // Valid until the name changes or the node goes.
    const char* get_name() const;
    // The text as it stands: no entity in it is interpreted.
    void set_content(const char* content);
    // The text, "" when there is none. Valid until the next call, a change, or the node's end; so
    // not for two threads at once.
    const char* get_content() const;

  private:
    _xmlNode* _node;
    mutable unsigned char* _content = nullptr;  // what get_content() gave away
};

inline void swap(node& a, node& b) noexcept {
    a.swap(b);
}

}  // KORVEX_NAMESPACE(korvex_compat)
}  // namespace xml
