#include "util/Logger/AppenderOutput.h"

#include "base/HeldLocks.h"
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

// Has the output to itself for a scope. A thread that is forking has it already.
class KORVEX_SCOPED_CAPABILITY LogAppender::Output::Alone {
  public:
    explicit Alone(Output& output) KORVEX_ACQUIRE(output._gate) KORVEX_NO_THREAD_SAFETY_ANALYSIS
        : _output(output),
          _kept(output._appender._registered || &output._appender == &rootAppender()),
          _lock(output._mutex, _kept ? LoggingLock::KEPT_THROUGH_FORKS : LoggingLock::OWN) {
        if (!isForking()) output._gate.shut();
    }
    Alone(const Alone&) = delete;
    Alone& operator=(const Alone&) = delete;
    ~Alone() KORVEX_RELEASE() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
        if (!isForking()) _output.reopenGate();
    }

  private:
    bool isForking() const { return _kept && HeldLocks::all(); }

    Output& _output;
    const bool _kept;
    const LoggingLock _lock;
};

LogAppender::Output::Output(const LogAppender& appender, FileDescriptor fd)
    : _appender(appender), _fd(fd) {}

LogAppender::Output::~Output() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    close();
}

bool LogAppender::Output::write(const std::string& line, long long now, Report& report) {
    if (const auto written = writeBesideOthers(line, now, report)) return *written;
    waitBriefly(_writing);
    const Alone alone(*this);
    const WhileWriting busy(_writing);
    rotateIfDue(now, report);
    return writeAlone(line, now, report);
}

// Nothing where the line has to be written alone. (The analysis cannot follow a visit that may not
// take place.)
std::optional<bool> LogAppender::Output::writeBesideOthers(
    const std::string& line, long long now, Report& report) KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    const HeldLocks::One mark;
    WriterGate::Visit visit(_gate);
    if (!visit.inside() || identityIsDue(now) || !reserve(line.size())) return std::nullopt;
    const unsigned openedAs = _openedAs;
    const std::size_t sent = send(line, report);
    const bool whole = sent == line.size();
    if (!whole) giveBack(line.size() - sent);
    const bool passed = sent > 0 && limitIsPassed();
    if (passed) _rotationIsDue.store(true, std::memory_order_relaxed);
    visit.leave();
    if (passed || !whole) finish(openedAs, whole, now, report);
    return whole;
}

// What the writer of a line has to do alone afterwards, unless somebody was faster.
void LogAppender::Output::finish(unsigned openedAs, bool whole, long long now, Report& report) {
    const Alone alone(*this);
    if (openedAs != _openedAs || !_fd.valid()) return;
    if (!rotateIfDue(now, report) && !whole) close();
}

bool LogAppender::Output::writeAlone(const std::string& line, long long now, Report& report) {
    if (_appender.writesToFile()) checkIdentity(now);
    if (!_fd.valid() && !openAndInit(now, report)) return false;
    const std::size_t sent = send(line, report);
    const bool whole = sent == line.size();
    _size.fetch_add(static_cast<std::int64_t>(sent), std::memory_order_relaxed);
    if (!_appender.writesToFile()) return whole;
    // Also behind a line that was cut, or a file that is full at this size would stay so for ever.
    if (sent > 0 && limitIsPassed()) {
        rotate(now, report);
    } else if (!whole) {
        close();
    }
    return whole;
}

// How many bytes were written.
std::size_t LogAppender::Output::send(const std::string& line, Report& report) const {
    errno = 0;  // a short count without an error must not be told with an older one
    const int written = _fd.write(line.data(), line.size());
    const std::size_t sent = written > 0 ? static_cast<std::size_t>(written) : 0;
    if (written < 0 || sent != line.size())
        __extension__ report.crit("Error writing to \"%s\": %m", _appender._filename);
    return sent;
}

// False, and nothing reserved, where the limit has been passed.
bool LogAppender::Output::reserve(std::size_t bytes) {
    if (_appender._maxSize <= 0) return true;
    const auto more = static_cast<std::int64_t>(bytes);
    if (_size.fetch_add(more, std::memory_order_relaxed) <= _appender._maxSize) return true;
    _size.fetch_sub(more, std::memory_order_relaxed);
    return false;
}

void LogAppender::Output::giveBack(std::size_t bytes) {
    if (_appender._maxSize > 0)
        _size.fetch_sub(static_cast<std::int64_t>(bytes), std::memory_order_relaxed);
}

// Reserved bytes count, so this is certain only while nobody is inside the gate.
bool LogAppender::Output::limitIsPassed() const {
    return _appender._maxSize > 0 && _size.load(std::memory_order_relaxed) > _appender._maxSize;
}

bool LogAppender::Output::rotateIfDue(long long now, Report& report) {
    if (!_rotationIsDue.exchange(false, std::memory_order_relaxed) || !limitIsPassed())
        return false;
    rotate(now, report);
    return true;
}

bool LogAppender::Output::identityIsDue(long long now) const {
    return now < _lastCheck || now > _lastCheck + kIdentityCheckInterval;
}

// Lets go of a file that was removed, renamed or replaced, for instance by a rotation from outside.
void LogAppender::Output::checkIdentity(long long now) {
    if (!_fd.valid() || !identityIsDue(now)) return;
    struct stat st {};
    if (!_appender._filename.stat(&st) || st.st_ino != _inodeNum || st.st_dev != _device) {
        close();
    } else {
        _lastCheck = now;
    }
}

bool LogAppender::Output::open(Report& report) {
    _fd = _appender._filename.openCreateOrAppend(Pathname::CREATE_NORMAL);
    if (_fd.valid()) return true;
    __extension__ report.error("Error opening \"%s\": %m", _appender._filename);
    return false;
}

bool LogAppender::Output::openAndInit(long long now, Report& report) {
    if (!open(report)) return false;
    struct stat st {};
    if (!_fd.stat(&st)) {
        __extension__ report.crit("Error calling fstat on \"%s\": %m", _appender._filename);
        close();
        return false;
    }
    ++_openedAs;
    _regular = S_ISREG(st.st_mode);
    _size.store(st.st_size, std::memory_order_relaxed);
    _inodeNum = st.st_ino;
    _device = st.st_dev;
    _lastCheck = now;
    return true;
}

// A descriptor without a file name was handed in, or is standard error: it is let go only.
void LogAppender::Output::close() {
    if (_appender.writesToFile()) {
        _fd.close();
    } else {
        _fd = FileDescriptor();
    }
    _regular = false;
}

// For a file that several may write to. (Else it stays shut, which the analysis does not know.)
void LogAppender::Output::reopenGate() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    if (_regular) _gate.open();
}

bool LogAppender::Output::valid() const KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    return _fd.valid();
}

void LogAppender::Output::replace(FileDescriptor fd) KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    _gate.shut();
    close();
    _fd = fd;
}

void LogAppender::Output::testOpen(Report& report) KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    replace(FileDescriptor());  // a report of another appender may have come here already
    open(report);
    close();
}

void LogAppender::Output::hold() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    _mutex.NOLOG_lock();
    _gate.shut();
}

void LogAppender::Output::release() KORVEX_NO_THREAD_SAFETY_ANALYSIS {
    reopenGate();
    _mutex.NOLOG_unlock();
}

}  // namespace korvex
