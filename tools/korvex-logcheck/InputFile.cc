#include "InputFile.h"

#include <cerrno>
#include <cstring>

#include "Status.h"
#include "Text.h"
#include "base/Stream.h"

namespace {

constexpr std::size_t kMost = 1U << 20U;  // of no configuration, but of a device without an end

[[noreturn]] void unreadable(const std::string& name, const std::string& why) {
    throw Failure("cannot read " + visible(name) + ": " + why);
}

std::string readAll(std::FILE* file, const std::string& name) {
    std::string bytes;
    char buf[65536];
    while (const std::size_t n = std::fread(buf, 1, sizeof buf, file)) {
        bytes.append(buf, n);
        if (bytes.size() > kMost) unreadable(name, "it is larger than 1 MiB");
    }
    if (std::ferror(file) != 0) unreadable(name, std::strerror(errno));
    return bytes;
}

}  // namespace

std::string readInput(const std::string& name) {
    if (name == "-") return readAll(stdin, "standard input");
    const Stream file(std::fopen(name.c_str(), "re"));
    if (!file) unreadable(name, std::strerror(errno));
    return readAll(file.get(), name);
}
