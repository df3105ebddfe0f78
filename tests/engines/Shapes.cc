#include "engines/Shapes.h"

#include <korvex/util/Thread.h>

#include <unistd.h>

#include <functional>
#include <utility>

namespace testsupport {

namespace {

std::vector<std::string> shapes(const std::string& mark) {
    return {
        "counted apple" + mark,
        "",
        "100% of %d %s %n %% and %m" + mark,
        "Gr\xC3\xB6\xC3\x9F"
        "e \xE6\x97\xA5\xE6\x9C\xAC\xE8\xAA\x9E \xF0\x9F\x99\x82" +
            mark,
        "  blanks at both ends" + mark + "  ",
        "first" + mark + "\n  second\n\n\tthird: [x] \nlast",
        "2026-11-21 07:59:28,929 [Main Thread] INFO  net: no line of its own" + mark,
        R"(say "it" 'so': \n \\ {"json": [1, null]} <x/> `$HOME` #)" + mark,
        std::string(3000, 'x') + mark,
        "ends in a newline" + mark + "\n",
        "a tab\tand a return\rwithin" + mark,
        "a: b] c | d - e] : f" + mark,
        "\nbegins with a newline" + mark,
        "   ",
        "01 begins with digits" + mark,
    };
}

// Runs what it is given.
class Runner : public Thread {
  public:
    Runner(const char* name, std::function<void()> what) : Thread(name), _what(std::move(what)) {}

  private:
    void main() override { _what(); }
    const std::function<void()> _what;
};

void write(LogAppender& appender, const Logged& one) {
    const Logger logger(one.channel.c_str());
    appender.write(LogMsgMetadata(&logger, one.level), one.message);
}

void writeForged(LogAppender& appender, const std::string& thread, std::vector<Logged>& all) {
    const Logger logger("net");
    const LogMsgMetadata metadata(&logger, INFO);
    std::string line;
    appender.layout().apply(line, metadata, "looks like a line");
    line.pop_back();
    appender.write(metadata, "two lines\n" + line);
    all.push_back({INFO, "net", thread, "two lines"});
    all.push_back({INFO, "net", thread, "looks like a line"});
}

}  // namespace

Logged loggedMessage(unsigned i) {
    const std::vector<std::string> texts = shapes(" #" + std::to_string(i));
    const auto level = static_cast<LogLevel>(i % 10);
    return {level, kChannels[i % kChannels.size()], "", texts[i % texts.size()]};
}

std::vector<Logged> logAll(LogAppender& appender, unsigned count, unsigned pause) {
    std::vector<Logged> all;
    const unsigned share = count / static_cast<unsigned>(kThreads.size()) + 1;
    for (unsigned done = 0; done < count;) {
        const std::string& thread = kThreads[done / share];
        const auto some = [&] {
            for (unsigned n = 0; n < share && done < count; ++n, ++done) {
                Logged one = loggedMessage(done);
                one.thread = thread;
                write(appender, one);
                all.push_back(one);
                if (done % 100 == 99) writeForged(appender, thread, all);
                if (done % 2000 == 1999) ::usleep(pause * 1000);
            }
        };
        if (done == 0) {
            some();
            continue;
        }
        Runner runner(thread.c_str(), some);
        runner.go();
        runner.join();
    }
    return all;
}

}  // namespace testsupport
