#include <korvex/util/Logger.h>

#include "base/ErrnoKeeper.h"
#include "base/PrintfBuffer.h"
#include "platform/ErrorText.h"

#include <cstring>

inline namespace korvex {

namespace {

const char* describe(int errnum, char (&buf)[1000]) {
    return errorText(errnum, buf, sizeof buf) ? buf : "UNKNOWN ERROR";
}

// The format with each %m replaced by the text of the error. A pair %% is skipped, so "%%m" is not
// %m.
std::string withErrorText(const char* fmt, int errnum) {
    char buf[1000];
    const char* const description = describe(errnum, buf);
    std::string result;
    while (const char* percent = std::strchr(fmt, '%')) {
        result.append(fmt, percent);
        fmt = percent + 1;
        if (*fmt == 'm') {
            result += description;
            ++fmt;
        } else {
            result += '%';
            if (*fmt != '\0') result += *fmt++;
        }
    }
    return result += fmt;
}

void formatByPrintf(std::string& out, const char* fmt, va_list ap)
    __attribute__((format(printf, 2, 0)));

void formatByPrintf(std::string& out, const char* fmt, va_list ap) {
    const PrintfBuffer text(fmt, ap);
    // If an argument cannot be converted, log the format itself rather than nothing.
    if (text.ok()) {
        out.assign(text.data(), text.size());
    } else {
        out = fmt;
    }
}

}  // namespace

void Logger::vformat(std::string& out, int errnum, const char* fmt, va_list ap) {
    const ErrnoKeeper keeper;
    errno = errnum;  // for "%-40m", which glibc itself replaces
    if (std::strstr(fmt, "%m") == nullptr) {
        formatByPrintf(out, fmt, ap);
    } else {
        formatByPrintf(out, withErrorText(fmt, errnum).c_str(), ap);
    }
}

void Logger::format(std::string& out, const char* fmt, ...) {
    const int errnum = errno;
    va_list ap;
    va_start(ap, fmt);
    vformat(out, errnum, fmt, ap);
    va_end(ap);
}

void Logger::format(std::string& out, int errnum, const char* fmt, ...) {
    va_list ap;
    va_start(ap, fmt);
    vformat(out, errnum, fmt, ap);
    va_end(ap);
}

}  // namespace korvex
