// A program whose own names are Korvex's too.
#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <cstdio>

enum Severity { DEBUG, INFO, ERROR };
class Mutex {};
class Pathname {};
class Thread {
  public:
    Mutex mutex;
};
class Logger {
  public:
    void info(const char* text, Severity severity = INFO) {
        std::printf("own %s %d\n", text, severity);
    }
};

// Defined by a file that names Korvex's Logger without "korvex::".
void logByName(korvex::Logger& logger);

int main() {
    Logger().info("hello");
    Logger().info("hello", ERROR);
    korvex::Logger logger("korvex");
    logByName(logger);
    const korvex::Mutex theirs;
    const korvex::Pathname path("/tmp");
    static_cast<void>(Thread());
    return sizeof(theirs) > sizeof(Mutex) && path.isDir() && korvex::ERROR == 4 ? 0 : 1;
}
