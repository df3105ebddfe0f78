#include <korvex/util/Logger.h>

#include <gtest/gtest.h>

#include <string>

#include "support/Child.h"

// What a program may have of its own.
#define DEBUG 17
#define ERROR 17

// The level test at the call, and the forms of a call.

namespace {

using testsupport::runInChild;

// What body logs on standard error through a logger of channel "net" with that minimum.
template <class Body>
std::string logged(const char* minimum, Body body) {
    return runInChild([&] {
               LogChannel::find("net", true)->changeLevel(minimum);
               Logger::initialize();
               Logger logger("net");
               body(logger);
               return 0;
           })
        .err;
}

void logAllByMacro(Logger& logger) {
    KORVEX_DEBUG(logger, "%s", "debug");
    KORVEX_INFO(logger, "%s", "info");
    KORVEX_WARN(logger, "%s", "warn");
    KORVEX_ERROR(logger, "%s", "error");
    KORVEX_CRIT(logger, "%s", "crit");
    KORVEX_FATAL(logger, "%s", "fatal");
}

TEST(CallSiteTest, EachMacroHasItsLevel) {
    EXPECT_EQ(logged("DEBUG", logAllByMacro), "debug\ninfo\nwarn\nerror\ncrit\nfatal\n");
    EXPECT_EQ(logged("INFO", logAllByMacro), "info\nwarn\nerror\ncrit\nfatal\n");
    EXPECT_EQ(logged("NOTICE", logAllByMacro), "warn\nerror\ncrit\nfatal\n");
    EXPECT_EQ(logged("ERROR", logAllByMacro), "error\ncrit\nfatal\n");
    EXPECT_EQ(logged("CRIT", logAllByMacro), "crit\nfatal\n");
    EXPECT_EQ(logged("ALERT", logAllByMacro), "fatal\n");
    EXPECT_EQ(logged("EMERG", logAllByMacro), "");
}

TEST(CallSiteTest, AMacroEvaluatesTheArgumentsOfWantedMessagesOnly) {
    EXPECT_EQ(logged("WARN",
                     [](Logger& logger) {
                         int evaluated = 0;
                         KORVEX_INFO(logger, "%d", ++evaluated);
                         KORVEX_WARN(logger, "%d", ++evaluated);
                         KORVEX_WARN(logger, std::to_string(++evaluated));
                     }),
              "1\n2\n");
}

TEST(CallSiteTest, AMacroEvaluatesItsLoggerOnceAndIsOneStatement) {
    EXPECT_EQ(logged("INFO",
                     [](Logger& logger) {
                         Logger* loggers[] = {&logger, nullptr};
                         Logger** next = loggers;
                         if (next != nullptr)
                             KORVEX_INFO(**next++, "one");
                         else
                             KORVEX_INFO(logger, "other");
                         KORVEX_INFO(logger, "%ld", static_cast<long>(next - loggers));
                     }),
              "one\n1\n");
}

TEST(CallSiteTest, BeforeInitialisationNothingIsDroppedThatIsWanted) {
    const auto result = runInChild([] {
        Logger logger("net");
        EXPECT_TRUE(logger.mayLog(static_cast<LogLevel>(0)));
        logAllByMacro(logger);
        return 0;
    });
    EXPECT_EQ(result.err, "info\nwarn\nerror\ncrit\nfatal\n");
}

TEST(CallSiteTest, MayLogIsExactOnceTheLoggerIsBound) {
    EXPECT_EQ(logged("CRIT",
                     [](Logger& logger) {
                         EXPECT_FALSE(logger.mayLog(static_cast<LogLevel>(4)));
                         EXPECT_TRUE(logger.mayLog(static_cast<LogLevel>(5)));
                         EXPECT_TRUE(logger.mayLog(static_cast<LogLevel>(6)));
                     }),
              "");
}

// What a program takes that was compiled before, or calls through a pointer.
TEST(CallSiteTest, TheMethodsExistOutOfLineToo) {
    using Method = void (Logger::*)(const char*, ...) noexcept;
    static constexpr Method methods[] = {&Logger::debug, &Logger::info, &Logger::warn,
                                         &Logger::error, &Logger::crit, &Logger::fatal};
    EXPECT_EQ(logged("WARN",
                     [](Logger& logger) {
                         int number = 0;
                         for (const Method method : methods)
                             (logger.*method)("%d", number++);
                     }),
              "2\n3\n4\n5\n");
}

}  // namespace
