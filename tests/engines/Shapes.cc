#include "engines/Shapes.h"

#include <korvex/util/Thread.h>

#include <unistd.h>

#include <functional>
#include <string>
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

// A pattern of the layout's dates alone, from the first to the last, without their widths.
std::string datesOf(const std::string& layout) {
    std::string dates;
    std::size_t end = 0;
    for (auto at = layout.find('%'); at != std::string::npos; at = layout.find('%', at)) {
        const auto letter = layout.find_first_not_of("-0123456789", at + 1);
        if (letter == std::string::npos) break;
        if (layout[letter] != 'd') {
            at = letter;
            continue;
        }
        if (!dates.empty()) dates += layout.substr(end, at - end);
        const bool hasFormat = layout.compare(letter + 1, 1, "{") == 0;
        end = (hasFormat ? layout.find('}', letter) : letter) + 1;
        at = end;
        dates += "%" + layout.substr(letter, end - letter);
    }
    return dates;
}

// Logs messages, and tells what was logged.
class Recorder {
  public:
    explicit Recorder(LogAppender& appender)
        : _appender(appender), _dates(datesOf(appender.layout().pattern()).c_str()) {}

    void write(Logged one) {
        const Logger logger(one.channel.c_str());
        const LogMsgMetadata metadata(&logger, one.level);
        _appender.write(metadata, one.message);
        add(one, metadata);
    }

    void writeForged(const std::string& thread) {
        const Logger logger("net");
        const LogMsgMetadata metadata(&logger, INFO);
        const std::string line = applied(_appender.layout(), metadata, "looks like a line");
        _appender.write(metadata, "two lines\n" + line.substr(0, line.size() - 1));
        add({INFO, "net", thread, "two lines", {}, {}, {}, {}}, metadata);
        add({INFO, "net", thread, "looks like a line", {}, {}, {}, {}}, metadata);
    }

    std::vector<Logged> all;

  private:
    static std::string applied(const LogFormat& layout, const LogMsgMetadata& metadata,
                               const std::string& message) {
        std::string text;
        layout.apply(text, metadata, message);
        return text;
    }
    void add(Logged one, const LogMsgMetadata& metadata) {
        one.time = applied(_dates, metadata, "");
        one.uptimeMs = applied(_milliseconds, metadata, "");
        one.uptimeS = applied(_seconds, metadata, "");
        one.utc = applied(_utc, metadata, "");
        all.push_back(std::move(one));
    }

    LogAppender& _appender;
    const LogFormat _dates;
    const LogFormat _milliseconds{"%r"};
    const LogFormat _seconds{"%R"};
    const LogFormat _utc{"%d{%Y-%m-%d %H:%M:%S.%l}"};
};

}  // namespace

Logged loggedMessage(unsigned i) {
    const std::vector<std::string> texts = shapes(" #" + std::to_string(i));
    const auto level = static_cast<LogLevel>(i % 10);
    return {level, kChannels[i % kChannels.size()], "", texts[i % texts.size()], {}, {}, {}, {}};
}

std::vector<Logged> logAll(LogAppender& appender, unsigned count, unsigned pause) {
    Recorder recorder(appender);
    const unsigned share = count / static_cast<unsigned>(kThreads.size()) + 1;
    for (unsigned done = 0; done < count;) {
        const std::string& thread = kThreads[done / share];
        const auto some = [&] {
            for (unsigned n = 0; n < share && done < count; ++n, ++done) {
                Logged one = loggedMessage(done);
                one.thread = thread;
                recorder.write(std::move(one));
                if (done % 100 == 99) recorder.writeForged(thread);
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
    return recorder.all;
}

}  // namespace testsupport
