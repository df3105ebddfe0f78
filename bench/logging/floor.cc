// What anyone must do for a message: look at the clock, format, and write the line under a lock.
#include "../support/LoggingRows.h"

#include <fcntl.h>
#include <pthread.h>
#include <sys/time.h>

#include <atomic>
#include <cstdarg>
#include <map>

namespace {

std::atomic<int> minLevel{1};
pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
bench::Setup setup;
int fd = -1;
unsigned long size = 0;
thread_local const char* threadName = "Main Thread";

void openFile(const char* name) {
    fd = open(name, O_WRONLY | O_CREAT | O_APPEND, 0644);
    if (fd < 0) bench::giveUp("cannot open the log file");
}

void rotate() {
    char from[64];
    char to[64];
    close(fd);
    for (unsigned i = setup.backups; i > 0; --i) {
        std::snprintf(to, sizeof to, "%s.%u", setup.file, i);
        std::snprintf(from, sizeof from, i > 1 ? "%s.%u" : "%s", setup.file, i - 1);
        static_cast<void>(std::rename(from, to));
    }
    openFile(setup.file);
    size = 0;
}

void writeLine(const char* line, std::size_t n) {
    pthread_mutex_lock(&mutex);
    if (write(fd, line, n) != static_cast<ssize_t>(n)) bench::giveUp("cannot write the log file");
    size += n;
    if (setup.maxSize != 0 && size > setup.maxSize) rotate();
    pthread_mutex_unlock(&mutex);
}

void logLine(const char* level, const char* fmt, va_list ap) {
    timeval t;
    gettimeofday(&t, nullptr);
    char message[512];
    char line[640];
    int n = std::vsnprintf(message, sizeof message, fmt, ap);
    if (setup.layout == bench::Layout::MESSAGE) {
        n = std::snprintf(line, sizeof line, "%s\n", message);
    } else {
        tm local;
        localtime_r(&t.tv_sec, &local);
        char date[32];
        std::strftime(date, sizeof date, "%Y-%m-%d %H:%M:%S", &local);
        n = std::snprintf(line, sizeof line, "%s,%03d [%s] %-5s %s: %s\n", date,
                          static_cast<int>(t.tv_usec / 1000), threadName, level, bench::kChannel,
                          message);
    }
    writeLine(line, static_cast<std::size_t>(n));
}

[[gnu::noinline, gnu::format(printf, 2, 3)]] void logAt(int level, const char* fmt, ...) {
    if (level < minLevel.load(std::memory_order_relaxed)) return;
    va_list ap;
    va_start(ap, fmt);
    logLine("INFO", fmt, ap);
    va_end(ap);
}

struct Floor {
    explicit Floor(const bench::Setup& wanted) {
        setup = wanted;
        openFile(setup.file);
    }
    void info(unsigned n, const char* who) { logAt(1, "request %u from %s answered", n, who); }
    void debug(unsigned n, const char* who) { logAt(0, "request %u from %s answered", n, who); }

    // A bare parse: every line split at its '=' into a map, and the files it names opened.
    static void configure(const char* file) {
        std::FILE* const config = std::fopen(file, "r");
        std::map<std::string, std::string> values;
        char line[256];
        while (std::fgets(line, sizeof line, config) != nullptr) {
            line[std::strcspn(line, "\n")] = '\0';
            char* const equals = std::strchr(line, '=');
            if (equals != nullptr) values[std::string(line, equals)] = equals + 1;
        }
        std::fclose(config);
        for (const auto& [key, value] : values) {
            if (key.find("fileName") != std::string::npos) openFile(value.c_str());
        }
    }
    static void first() { logAt(1, "request %u from %s answered", 1u, bench::kWho); }
};

}  // namespace

int main(int argc, char** argv) {
    return bench::loggingMain<Floor>(argc, argv);
}
