#include "scenarios/Workers.h"

#include <korvex/util/Logger.h>

#include <atomic>
#include <cstring>
#include <memory>

#include "scenarios/Logging.h"
#include "scenarios/Parallel.h"

// Threads that start, end and are destroyed while others ask who they are and log.

namespace schedules {

namespace {

constexpr const char* kNames =
    "rootCategory=INFO,A\nappender.A=File\nappender.A.fileName=log\n"
    "appender.A.layout.ConversionPattern=%t %m%n\n";

void knowThemselves() {
    const Thread mainThread;
    Worker* selves[2] = {};
    const auto look = [&](int i, const char* name) {
        require(Thread::current() == selves[i], "current() is another thread");
        require(std::strcmp(Thread::currentName(), name) == 0, "currentName() is another's");
        require(selves[i]->isCurrent(), "isCurrent() says no");
    };
    Worker one("one", [&] { look(0, "one"); });
    Worker two("two", [&] { look(1, "two"); });
    selves[0] = &one;
    selves[1] = &two;
    one.go();
    two.go();
    require(Thread::current() == nullptr, "the main thread has an object");
    one.join();
    two.join();
}

// The last one to end takes the key with it, and the next one makes a new one.
void comeAndGo() {
    const Thread mainThread;
    const auto live = [] {
        Worker worker("short", [] {
            require(std::strcmp(Thread::currentName(), "short") == 0, "currentName() is another's");
        });
        worker.go();
        worker.join();
    };
    Parallel threads{live};
    live();
    threads.join();
}

void logTheirNames() {
    const Thread mainThread;
    configure(kNames);
    Logger logger("test");
    Worker one("one", [&] { logger.info("first"); });
    Worker two("two", [&] { logger.info("%s", "second"); });
    one.go();
    two.go();
    logger.info("third");
    one.join();
    two.join();
}

std::string checkNames(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")),
                   {"one first", "two second", "Main Thread third"});
}

// Once the main thread is dying, a Thread may be destroyed while its thread is in main(), which
// then must not touch it.
class Left : public Thread {
  public:
    Left() : Thread("left") {}

  private:
    void main() override;
};

Logger& leftLogger() {
    static Logger& logger = *new Logger("left");
    return logger;
}

std::atomic<bool> leftHasBegun{false};

void Left::main() {
    leftHasBegun = true;
    leftLogger().info("first");
    leftLogger().info("second");
}

void outliveTheirObjects() {
    const Thread mainThread;
    configure(kNames);
    leftLogger();
    auto left = std::make_unique<Left>();
    left->go();
    Thread::mainThreadDying();
    waitUntil(leftHasBegun);
    left.reset();
    waitForTheOthers();
}

std::string checkLeft(const Remains& remains) {
    return compare("the log", Remains::lines(remains.file("log")), {"left first", "left second"});
}

const Register registered{
    {"threads-know-themselves", &knowThemselves},
    {"threads-come-and-go", &comeAndGo},
    {"threads-log-their-names", &logTheirNames, &checkNames},
    {"threads-outlive-their-objects", &outliveTheirObjects, &checkLeft},
};

}  // namespace

}  // namespace schedules
