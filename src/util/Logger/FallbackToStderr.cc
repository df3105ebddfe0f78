#include "util/Logger/FallbackToStderr.h"

#include <unistd.h>

inline namespace korvex {

void fallback_to_stderr(LogLevel level, const std::string& text) {
    unsigned long len = 0;
    const char* const name = loglevel2str(&len, level);
    std::string line;
    line.reserve(len + text.size() + 4);
    line.append(name, len).append(" - ").append(text).append("\n");
    const ssize_t ignored = ::write(STDERR_FILENO, line.data(), line.size());
    static_cast<void>(ignored);
}

}  // namespace korvex
