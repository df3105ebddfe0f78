#include "file/Lock.h"

#include <sys/file.h>

#include <cerrno>
#include <thread>

#include "terminal/Progress.h"
#include "text/Counted.h"

namespace {

constexpr std::chrono::milliseconds kPause(20);

void take(const OpenFile& file, const Patience& patience) {
    const int how = LOCK_EX | (patience.hasEnd() ? LOCK_NB : 0);
    while (flock(file.fd(), how) != 0) {
        if (errno == EINTR) continue;
        if (errno != EWOULDBLOCK) throw Failure(IO_ERROR, withErrno("cannot lock " + file.name()));
        if (patience.isOver()) {
            throw Failure(IO_ERROR, file.name() + ": another run is changing it; waited " +
                                        counted(patience.seconds(), "second"));
        }
        std::this_thread::sleep_for(kPause);
    }
}

}  // namespace

Patience::Patience(std::optional<unsigned> seconds)
    : _seconds(seconds),
      _end(std::chrono::steady_clock::now() + std::chrono::seconds(seconds.value_or(0))) {}

bool Patience::isOver() const {
    return std::chrono::steady_clock::now() >= _end;
}

bool lock(OpenFile& file, const Patience& patience) {
    progressStep("waiting for another run");
    take(file, patience);
    // The run that was waited for has put another file in this one's place.
    return file.isStillNamed();
}
