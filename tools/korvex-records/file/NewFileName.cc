#include "file/NewFileName.h"

#include <sys/random.h>

#include <algorithm>
#include <string_view>

#include "Status.h"
#include "text/Escape.h"

namespace {

constexpr std::string_view kStart = ".korvex-records.";
constexpr std::size_t kRandomBytes = 8;

}  // namespace

std::string inventNewFileName() {
    char bytes[kRandomBytes];
    if (getrandom(bytes, sizeof bytes, 0) != static_cast<ssize_t>(sizeof bytes)) {
        throw Failure(IO_ERROR, withErrno("cannot get random bytes"));
    }
    return std::string(kStart) + toHex({bytes, sizeof bytes});
}

bool isNewFileName(const std::string& name) {
    return name.size() == kStart.size() + 2 * kRandomBytes &&
           name.compare(0, kStart.size(), kStart) == 0 &&
           name.find_first_not_of("0123456789abcdef", kStart.size()) == name.npos;
}
