#include <korvex/util/Logger.h>

#include "base/ThreadText.h"
#include "util/Logger/AppenderReport.h"
#include "util/Logger/BriefWait.h"
#include "util/Logger/NologLock.h"
#include "util/Logger/RootObjects.h"

#include <sys/stat.h>

#include <cerrno>

inline namespace korvex {

namespace {

// Seconds between two looks at whether the open file is still the one of that name.
constexpr long long kIdentityCheckInterval = 5;

}  // namespace

LogAppender::LogAppender() = default;

LogAppender::LogAppender(FileDescriptor fd, const LogFormat* layout) : _fd(fd), _fmt(layout) {}

// Nobody else may know an appender that is being destroyed, so no lock is taken.
LogAppender::~LogAppender() noexcept KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    if (!_filename.empty()) _fd.close();
}

// The root appender stays what it is, whatever file name it was given.
bool LogAppender::writesToFile() const {
    return !_filename.empty() && this != &rootAppender();
}

// The report of another appender may arrive before this one's configuration is complete.
const LogFormat& LogAppender::layout() const {
    return _fmt != nullptr ? *_fmt : defaultFormat();
}

void LogAppender::write(const LogMsgMetadata& mdata, const std::string& msg) {
    ThreadText m;
    layout().apply(*m, mdata, msg);
    Report report(this);
    waitBriefly(_writing);
    {
        const NologLock lock(_mutex);
        _writing.store(true, std::memory_order_relaxed);
        writeLine(*m, mdata.stamp.sec(), report);
        _writing.store(false, std::memory_order_relaxed);
    }
    report.deliver();
}

void LogAppender::writeLine(const std::string& line, long long now, Report& report) {
    if (writesToFile()) checkIdentity(now);
    if (!_fd.valid() && !openAndInitFile(now, report)) return;
    errno = 0;  // a short count without an error must not be told with an older one
    const int written = _fd.write(line.data(), line.size());
    if (written > 0) _curSize += written;
    if (written < 0 || static_cast<std::size_t>(written) < line.size()) {
        const int error = errno;
        if (writesToFile()) closeFd();
        errno = error;
        __extension__ report.crit("Error writing to \"%s\": %m", _filename);
        return;
    }
    if (writesToFile() && _maxSize > 0 && _curSize > _maxSize) rotateFile(now, report);
}

// Lets go of a file that was removed, renamed or replaced, for instance by a rotation from outside.
void LogAppender::checkIdentity(long long now) {
    if (!_fd.valid()) return;
    if (now >= _lastCheck && now <= _lastCheck + kIdentityCheckInterval) return;
    struct stat st {};
    if (!_filename.stat(&st) || st.st_ino != _inodeNum || st.st_dev != _device) {
        closeFd();
    } else {
        _lastCheck = now;
    }
}

bool LogAppender::openFile(Report& report) {
    _fd = _filename.openCreateOrAppend(Pathname::CREATE_NORMAL);
    if (_fd.valid()) return true;
    __extension__ report.error("Error opening \"%s\": %m", _filename);
    return false;
}

bool LogAppender::openAndInitFile(long long now, Report& report) {
    if (!openFile(report)) return false;
    struct stat st {};
    if (!_fd.stat(&st)) {
        const int error = errno;
        closeFd();
        errno = error;
        __extension__ report.crit("Error calling fstat on \"%s\": %m", _filename);
        return false;
    }
    _curSize = st.st_size;
    _inodeNum = st.st_ino;
    _device = st.st_dev;
    _lastCheck = now;
    return true;
}

void LogAppender::closeFd() {
    _fd.close();
}

}  // namespace korvex
