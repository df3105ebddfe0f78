// A unit test that looks at what a function logs.
#include <korvex/util/Logger.h>

#include <cstdio>
#include <fstream>
#include <iterator>

static Logger logger("mail");

// The code under test.
static void deliver(int bytes) {
    if (bytes > 1000)
        logger.warn("%d bytes are too many", bytes);
    else
        logger.debug("delivered %d bytes", bytes);
}

// Collects every message of the process. Make one object, before the first test.
class LogCapture {
  public:
    LogCapture() {
        std::ofstream("test.cfg") << "rootCategory=DEBUG, TEST\n"
                                     "appender.TEST.fileName=test.log\n"
                                     "appender.TEST.layout.ConversionPattern=%p %c: %m%n\n";
        Logger::initialize(Pathname("test.cfg"), Pathname());
    }
    // What was logged since the last call.
    std::string take() {
        std::ifstream file("test.log");
        const std::string text{std::istreambuf_iterator<char>(file), {}};
        Pathname("test.log").truncate(0);
        return text;
    }
};

static bool check(const std::string& actual, const std::string& expected) {
    std::printf("%s: %s", actual == expected ? "passed" : "FAILED", actual.c_str());
    return actual == expected;
}

int main() {
    LogCapture log;
    deliver(12);
    bool ok = check(log.take(), "DEBUG mail: delivered 12 bytes\n");
    deliver(1001);
    ok = check(log.take(), "WARN mail: 1001 bytes are too many\n") && ok;
    return ok ? 0 : 1;
}
