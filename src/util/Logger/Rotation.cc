#include "util/Logger/Rotation.h"

#include "util/Logger/AppenderOutput.h"
#include "util/Logger/AppenderReport.h"

#include <cstdio>

inline namespace korvex {

namespace {

// Number 0 is the log file itself, number k its k-th backup.
void nameBackup(Pathname& out, const Pathname& file, unsigned suffix) {
    out = file;
    if (suffix == 0) return;
    char buf[21];
    std::snprintf(buf, sizeof buf, ".%u", suffix);
    out += buf;
}

}  // namespace

// Moves the file and its backups up by one, as far as the first gap; when there is none the oldest
// goes. Without backups the oldest is the file itself, which so starts again empty. What rename and
// unlink say is not looked at: logging goes on in whatever file can be opened.
void LogAppender::Output::rotate(long long now, Report& report) {
    close();
    const Pathname& file = _appender._filename;
    const std::uint32_t backups = _appender._maxBackupIndex;
    Pathname name;
    const std::uint32_t suffix = firstGap(backups, [&](std::uint32_t k) {
        nameBackup(name, file, k);
        return name.exists();
    });
    if (suffix == backups) {
        nameBackup(name, file, suffix);
        name.unlink();
    }
    for (std::uint32_t j = suffix; j > 0; --j) {
        Pathname target;
        nameBackup(target, file, j);
        nameBackup(name, file, j - 1);
        name.renameTo(target);
    }
    openAndInit(now, report);
}

}  // namespace korvex
