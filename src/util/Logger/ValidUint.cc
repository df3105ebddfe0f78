#include <korvex/util/Logger/ValidUint.h>

#include <cstring>

inline namespace korvex {

bool isValidUint(const char* s) {
    const std::size_t length = std::strlen(s);
    if (length == 0 || std::strspn(s, "0123456789") != length) return false;
    return s[0] != '0' || length == 1;
}

}  // namespace korvex
