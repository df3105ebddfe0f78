#include <korvex/util/Logger.h>

#include "base/ThreadText.h"
#include "util/Logger/AppenderReport.h"
#include "util/Logger/BriefWait.h"
#include "util/Logger/LoggingLock.h"
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
    closeFd();
}

// The root appender stays what it is, whatever file name it was given.
bool LogAppender::writesToFile() const {
    return !_filename.empty() && this != &rootAppender();
}

// The report of another appender may arrive before this one's configuration is complete.
const LogFormat& LogAppender::layout() const {
    return _fmt != nullptr ? *_fmt : rootAppender().layout();
}

void LogAppender::write(const LogMsgMetadata& mdata, const std::string& msg) {
    tryWrite(mdata, msg);
}

bool LogAppender::tryWrite(const LogMsgMetadata& mdata, const std::string& msg) {
    ThreadText m;
    layout().apply(*m, mdata, msg);
    Report report(this);
    waitBriefly(_writing);
    bool written = false;
    {
        const bool kept = _registered || this == &rootAppender();
        const LoggingLock lock(_mutex, kept ? LoggingLock::KEPT_THROUGH_FORKS : LoggingLock::OWN);
        const WhileWriting busy(_writing);
        written = writeLine(*m, mdata.stamp.sec(), report);
    }
    report.deliver();
    return written;
}

bool LogAppender::writeLine(const std::string& line, long long now, Report& report) {
    if (writesToFile()) checkIdentity(now);
    if (!_fd.valid() && !openAndInitFile(now, report)) return false;
    errno = 0;  // a short count without an error must not be told with an older one
    const int written = _fd.write(line.data(), line.size());
    const bool whole = written >= 0 && static_cast<std::size_t>(written) == line.size();
    if (!whole) __extension__ report.crit("Error writing to \"%s\": %m", _filename);
    if (written > 0) _curSize += written;
    if (!writesToFile()) return whole;
    // Also behind a line that was cut, or a file that is full at this size would stay so for ever.
    if (written > 0 && _maxSize > 0 && _curSize > _maxSize) {
        rotateFile(now, report);
    } else if (!whole) {
        closeFd();
    }
    return whole;
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
        __extension__ report.crit("Error calling fstat on \"%s\": %m", _filename);
        closeFd();
        return false;
    }
    _curSize = st.st_size;
    _inodeNum = st.st_ino;
    _device = st.st_dev;
    _lastCheck = now;
    return true;
}

// A descriptor without a file name was handed in, or is standard error: it is let go only.
void LogAppender::closeFd() {
    if (writesToFile()) {
        _fd.close();
    } else {
        _fd = FileDescriptor();
    }
}

}  // namespace korvex
