#pragma once

#include <string>

// Just enough to be taken for a system's xmlwrapp.
namespace xml {

class node {
  public:
    node() = default;
    explicit node(const char* name) : _name(name) {}
    node(const char* name, const char* content) : _name(name), _content(content) {}
    void swap(node& other) { std::swap(*this, other); }
    void set_name(const char* name) { _name = name; }
    const char* get_name() const { return _name.c_str(); }
    void set_content(const char* content) { _content = content; }
    const char* get_content() const { return _content.c_str(); }

  private:
    std::string _name = "blank";
    std::string _content;
};

}  // namespace xml
