#pragma once

#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Logger/LogAppender.h>
#include <korvex/util/ThreadObj.h>

#include <sys/types.h>

#include <atomic>
#include <cstdint>
#include <optional>
#include <string>

#include "util/Logger/WriterGate.h"

inline namespace korvex {

// What an appender writes to: its file, or a descriptor that was given to it.
//
// The kernel keeps the writers of a regular file in order. It does that faster than a lock here
// could, because it spins while the owner of the file's lock runs. So a thread that only writes is
// inside the gate, together with other threads. A thread that opens or rotates the file, checks its
// identity, handles an error, or forks has the output alone: it holds the mutex, and the gate is
// shut. The gate is open only while a regular file is open. Everything else is written under the
// mutex.
//
// A writer reserves its bytes before it writes. It may enter only if the bytes reserved so far are
// within the limit. So at most one line passes the limit. All later lines wait until the file was
// rotated: by the writer of that line, or by the first waiting thread that gets the mutex.
class KORVEX_HIDDEN LogAppender::Output {
  public:
    Output(const LogAppender& appender, FileDescriptor fd);
    // No other thread may use it any more.
    ~Output();

    // Returns whether all of the line was written. Adds failures to the report. `now`: seconds.
    bool write(const std::string& line, long long now, Report& report);

    // These three belong to start-up, before other threads log, and take no lock.
    bool valid() const;               // whether there is a descriptor
    void replace(FileDescriptor fd);  // closes the file in use
    void testOpen(Report& report);

    // For use around a fork: no thread is inside meanwhile.
    void hold();
    void release();

  private:
    class Alone;

    std::optional<bool> writeBesideOthers(const std::string& line, long long now, Report& report);
    void finish(unsigned openedAs, bool whole, long long now, Report& report);
    bool writeAlone(const std::string& line, long long now, Report& report) KORVEX_REQUIRES(_gate);
    std::size_t send(const std::string& line, Report& report) const KORVEX_REQUIRES_SHARED(_gate);

    bool reserve(std::size_t bytes);
    void giveBack(std::size_t bytes);
    bool limitIsPassed() const;

    bool identityIsDue(long long now) const KORVEX_REQUIRES_SHARED(_gate);
    void checkIdentity(long long now) KORVEX_REQUIRES(_gate);
    bool open(Report& report) KORVEX_REQUIRES(_gate);
    bool openAndInit(long long now, Report& report) KORVEX_REQUIRES(_gate);
    bool rotateIfDue(long long now, Report& report) KORVEX_REQUIRES(_gate);
    void rotate(long long now, Report& report) KORVEX_REQUIRES(_gate);
    void close() KORVEX_REQUIRES(_gate);
    void reopenGate() KORVEX_RELEASE(_gate);

    const LogAppender& _appender;
    FileDescriptor _fd KORVEX_GUARDED_BY(_gate);
    // Whether that is a regular file, opened here.
    bool _regular KORVEX_GUARDED_BY(_gate) = false;
    // Counts the files that were opened; wraps around.
    unsigned _openedAs KORVEX_GUARDED_BY(_gate) = 0;
    // Identity of the open file: an inode number alone is unique on one device only.
    ino_t _inodeNum KORVEX_GUARDED_BY(_gate) = 0;
    dev_t _device KORVEX_GUARDED_BY(_gate) = 0;
    // Seconds: when that identity was confirmed.
    long long _lastCheck KORVEX_GUARDED_BY(_gate) = 0;
    // Whether a line has passed the limit.
    std::atomic<bool> _rotationIsDue{false};
    // Whether a thread has the output alone: a hint for threads that are about to wait for it.
    std::atomic<bool> _writing{false};
    Mutex _mutex;

    // Each writer changes these two. What writers only read is kept apart, before the mutex.
    WriterGate _gate;
    // Bytes in the file and reserved bytes, as far as known. Maintained only if there is a limit.
    std::atomic<std::int64_t> _size{0};
};

}  // namespace korvex
