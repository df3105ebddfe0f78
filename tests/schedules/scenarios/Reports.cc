#include <korvex/util/Logger.h>

#include <memory>

#include "scenarios/Logging.h"
#include "scenarios/Parallel.h"

// Reports of appenders that fail: each failure is told once wherever something still works.

namespace schedules {

namespace {

std::string failing(const std::string& name, const std::string& path) {
    return "appender." + name + "=File\nappender." + name + ".fileName=" + path + "\n";
}

// An appender of a file that cannot be opened tells its name, so that failures can be told apart.
std::string openError(const std::string& path) {
    return "Error opening \"" + path + "\": No such file or directory";
}

// Only failing appenders are offered the reports: standard error gets them.
void nobodyTakesThem() {
    configure("rootCategory=INFO,F\ncategory.Logger=INFO,G\n" + failing("F", "no/f") +
              failing("G", "no/g"));
    Logger logger("test");
    Parallel threads{[&] { logger.info(std::string("one")); }};
    logger.info(std::string("two"));
    threads.join();
}

// F's for each line and for the test at the end of the configuration; G's for each report of those,
// which it was to take, and for its own test.
std::string checkNobody(const Remains& remains) {
    const unsigned f = count(openError("no/f"), remains.err);
    const unsigned g = count(openError("no/g"), remains.err);
    if (f == 3 && g == 4) return "";
    return "F's failure is told " + std::to_string(f) + " times, G's " + std::to_string(g) +
           " times:\n" + remains.err;
}

void twoFail() {
    configure("rootCategory=INFO,F,G,A\ncategory.Logger=INFO,A\n" + failing("F", "no/f") +
              failing("G", "no/g") + failing("A", "log"));
    Logger logger("test");
    Parallel threads{[&] { logger.info(std::string("one")); }};
    logger.info(std::string("two"));
    threads.join();
}

std::string checkTwoFail(const Remains& remains) {
    const std::string f = openError("no/f");
    const std::string g = openError("no/g");
    return compare("the log", Remains::lines(remains.file("log")),
                   {f, g, "one", "two", f, f, g, g});
}

// The reports of one thread go where the other one is just writing, and the other way round.
void acrossTwoChannels() {
    configure("rootCategory=INFO,F,A\ncategory.Logger=INFO,G,A\n" + failing("F", "no/f") +
              failing("G", "no/g") + failing("A", "log"));
    Logger logger("test");
    Logger internal("Logger");
    Parallel threads{[&] { internal.info(std::string("one")); }};
    logger.info(std::string("two"));
    threads.join();
}

std::string checkAcross(const Remains& remains) {
    const std::string log = remains.file("log") + remains.err;
    if (count("one", log) != 1 || count("two", log) != 1)
        return "a line is lost or doubled:\n" + log;
    return count(openError("no/f"), log) == 2 ? "" : "F's failure is not told twice:\n" + log;
}

// Each of the two is told of the other's failure, and fails at that.
void intoEachOther() {
    configure("rootCategory=INFO,F\ncategory.other=INFO,G\ncategory.Logger=INFO,F,G\n" +
              failing("F", "no/f") + failing("G", "no/g"));
    Logger logger("test");
    Logger other("other");
    Parallel threads{[&] { other.info(std::string("one")); }};
    logger.info(std::string("two"));
    threads.join();
}

std::string checkIntoEachOther(const Remains& remains) {
    const unsigned f = count(openError("no/f"), remains.err);
    const unsigned g = count(openError("no/g"), remains.err);
    return f >= 2 && g >= 2 ? "" : "a failure is not told:\n" + remains.err;
}

// A text that another thread lengthens between the two passes over a format.
void lengthenedText() {
    configure("rootCategory=INFO,A\n" + failing("A", "log"));
    Logger logger("test");
    auto text = std::make_unique<char[]>(2001);
    std::fill_n(text.get(), 300, 'x');
    Parallel threads{[&] { std::fill_n(text.get(), 2000, 'x'); }};
    logger.info("%s", text.get());
    threads.join();
}

std::string checkLengthened(const Remains& remains) {
    const std::string log = remains.file("log");
    const std::size_t others = log.find_first_not_of('x');
    return log.size() >= 301 && others == log.size() - 1 && log.back() == '\n'
               ? ""
               : "the line holds other bytes than the text's";
}

const Register registered{
    {"reports-nobody-takes", &nobodyTakesThem, &checkNobody},
    {"reports-into-each-other", &intoEachOther, &checkIntoEachOther},
    {"reports-of-two", &twoFail, &checkTwoFail},
    {"reports-across-channels", &acrossTwoChannels, &checkAcross},
    {"text-lengthened", &lengthenedText, &checkLengthened},
};

}  // namespace

}  // namespace schedules
