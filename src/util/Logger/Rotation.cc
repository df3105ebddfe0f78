#include "util/Logger/Rotation.h"

#include <korvex/util/Logger/LogAppender.h>

#include "util/Logger/AppenderReport.h"

#include <cstdio>

inline namespace korvex {

// Number 0 is the log file itself, number k its k-th backup.
void LogAppender::filenameWithSuffix(Pathname& out, unsigned suffix) const {
    out = _filename;
    if (suffix == 0) return;
    char buf[21];
    std::snprintf(buf, sizeof buf, ".%u", suffix);
    out += buf;
}

// Moves the file and its backups up by one, as far as the first gap; when there is none the oldest
// goes. Without backups the oldest is the file itself, which so starts again empty. What rename and
// unlink say is not looked at: logging goes on in whatever file can be opened.
void LogAppender::rotateFile(long long now, Report& report) {
    closeFd();
    Pathname name;
    const std::uint32_t suffix = firstGap(_maxBackupIndex, [&](std::uint32_t k) {
        filenameWithSuffix(name, k);
        return name.exists();
    });
    if (suffix == _maxBackupIndex) {
        filenameWithSuffix(name, suffix);
        name.unlink();
    }
    for (std::uint32_t j = suffix; j > 0; --j) {
        Pathname target;
        filenameWithSuffix(target, j);
        filenameWithSuffix(name, j - 1);
        name.renameTo(target);
    }
    openAndInitFile(now, report);
}

}  // namespace korvex
