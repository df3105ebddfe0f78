#pragma once

// Replaces xmlwrapp's node if Korvex is built without that library. It has only what Korvex uses,
// and is based on libxml2. This folder is on the include path only in such a build. The inner
// namespace separates the two classes in a program that links both. A file that includes both
// defines KORVEX_QUALIFIED_NAMES: there, xml::node is xmlwrapp's, and korvex::XmlNode is this one.

#include <korvex/Export.h>

struct _xmlNode;

namespace xml {
KORVEX_NAMESPACE(korvex_compat) {

// One XML element: a name and its text. A value; copies are deep. Names and contents are
// NUL-terminated UTF-8 and are copied. Throws std::bad_alloc if memory runs out. As thread-safe as
// a std::string, except for get_content().
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
    // Valid until the name changes or the node is destroyed.
    const char* get_name() const;
    // Sets the text. No entity in it is interpreted.
    void set_content(const char* content);
    // The text, or "" if there is none. Valid until the next call, a change, or the destruction of
    // the node. So two threads must not call it at once.
    const char* get_content() const;

  private:
    _xmlNode* _node;
    mutable unsigned char* _content = nullptr;  // the result of get_content()
};

inline void swap(node& a, node& b) noexcept {
    a.swap(b);
}

}  // KORVEX_NAMESPACE(korvex_compat)
}  // namespace xml
