#include "base/Assert.h"

#include <cstdio>
#include <cstdlib>

inline namespace korvex {

void assertionFailed(const char* file, unsigned line, const char* condition) noexcept {
    std::fprintf(stderr, "%s:%u: failed assertion `%s'\n", file, line, condition);
    std::abort();
}

}  // namespace korvex
