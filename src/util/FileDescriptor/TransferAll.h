#pragma once

#include <sys/types.h>

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstddef>

inline namespace korvex {

// The loop of every whole-buffer transfer: call(p, n) moves up to n bytes, as read(2) and write(2)
// do. Continues after short counts and interruptions. Stops at 0, at an error, and at INT_MAX
// bytes, the largest possible result.
template <class Byte, class Call>
int transferAll(Byte* p, std::size_t n, Call call) {
    const int errnoBefore = errno;
    std::size_t remaining = std::min<std::size_t>(n, INT_MAX);
    int total = 0;
    for (;;) {
        const ssize_t moved = call(p, remaining);
        if (moved < 0 && errno == EINTR) {
            errno = errnoBefore;
            continue;
        }
        if (moved <= 0) return total > 0 ? total : static_cast<int>(moved);
        total += static_cast<int>(moved);
        remaining -= static_cast<std::size_t>(moved);
        p += moved;
        if (remaining == 0) return total;
    }
}

}  // namespace korvex
