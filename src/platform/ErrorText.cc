#include "platform/ErrorText.h"

#include "platform/LibcLock.h"

#include <cstring>

#ifdef __GLIBC__
// glibc declares its own strerror_r in C++, which invents a text for unknown numbers and never
// fails; this is the name of the POSIX one.
extern "C" int __xpg_strerror_r(int errnum, char* buf, size_t size);
#define KORVEX_STRERROR_R __xpg_strerror_r
#else
#define KORVEX_STRERROR_R strerror_r
#endif

inline namespace korvex {

bool errorText(int errnum, char* buf, std::size_t size) {
    if (LibcLock::isInside()) return false;  // the C library would wait for its own lock
    const LibcLock lock;
    return KORVEX_STRERROR_R(errnum, buf, size) == 0;
}

}  // namespace korvex
