#include "terminal/Progress.h"

#include <unistd.h>

#include <atomic>
#include <condition_variable>
#include <mutex>
#include <string>
#include <system_error>
#include <thread>

#include "support/TerminalQuery.h"
#include "terminal/ProgressLine.h"

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

std::mutex mutex;
// Under the mutex:
const char* currentWhat = nullptr;
std::uint64_t currentTotal = 0;
std::size_t shown = 0;  // characters on the terminal's line
// Told for each record, so it takes no lock.
std::atomic<std::uint64_t> currentDone{0};

// A terminal that is gone is nobody's loss.
void toTerminal(const std::string& text) {
    static_cast<void>(write(STDERR_FILENO, text.data(), text.size()) < 0);
}

// Blanks and returns only, so that any terminal will do.
void erase() {
    if (shown > 0) toTerminal("\r" + std::string(shown, ' ') + "\r");
    shown = 0;
}

void draw(milliseconds elapsed) {
    if (currentWhat == nullptr) return;
    // The last column stays free: some terminals would begin a new line.
    const std::string line = progressLine({currentWhat, currentDone, currentTotal}, elapsed,
                                          columnsOf(STDERR_FILENO) - 1);
    const std::size_t rest = shown > line.size() ? shown - line.size() : 0;
    toTerminal("\r" + line + std::string(rest, ' '));
    shown = line.size() + rest;
}

}  // namespace

class ProgressDisplay::Ticker {
  public:
    Ticker() : _thread([this] { run(); }) {}
    Ticker(const Ticker&) = delete;
    Ticker& operator=(const Ticker&) = delete;
    ~Ticker() {
        {
            const std::lock_guard<std::mutex> guard(mutex);
            _ended = true;
        }
        _wake.notify_one();
        _thread.join();
    }

  private:
    void run() {
        const Clock::time_point start = Clock::now();
        std::unique_lock<std::mutex> lock(mutex);
        for (milliseconds wait(1000); !_wake.wait_for(lock, wait, [this] { return _ended; });
             wait = milliseconds(100)) {
            draw(std::chrono::duration_cast<milliseconds>(Clock::now() - start));
        }
        erase();
    }

    bool _ended = false;
    std::condition_variable _wake;
    std::thread _thread;
};

ProgressDisplay::ProgressDisplay() {
    if (!isTerminal(STDERR_FILENO)) return;
    try {
        _ticker = std::make_unique<Ticker>();
    } catch (const std::system_error&) {  // no thread to be had: the work goes on unseen
    }
}

ProgressDisplay::~ProgressDisplay() = default;

void progressStep(const char* what, std::uint64_t total) {
    const std::lock_guard<std::mutex> guard(mutex);
    currentWhat = what;
    currentTotal = total;
    currentDone = 0;
}

void progressAt(std::uint64_t done) {
    currentDone.store(done, std::memory_order_relaxed);
}

void progressAside() {
    const std::lock_guard<std::mutex> guard(mutex);
    currentWhat = nullptr;
    erase();
}
