#include <korvex/util/Pathname.h>

#include <cstring>

inline namespace korvex {

const char PathList::listSep = ':';

PathList::PathList(std::set<Pathname>::const_iterator first,
                   std::set<Pathname>::const_iterator last)
    : std::vector<Pathname>(first, last) {}

PathList::PathList(const char* s, char sep) {
    push_back_separated(s, sep);
}

PathList::PathList(const std::string& s, char sep) {
    push_back_separated(s.c_str(), sep);
}

void PathList::push_back_separated(const char* s, char sep) {
    while (*s != '\0') {
        const char* const cut = sep == '\0' ? nullptr : std::strchr(s, sep);
        const std::size_t length =
            cut != nullptr ? static_cast<std::size_t>(cut - s) : std::strlen(s);
        if (length > 0) push_back(Pathname(s, length));
        s += length;
        if (cut != nullptr) ++s;
    }
}

}  // namespace korvex
