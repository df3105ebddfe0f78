#include <korvex/util/Logger.h>

#include <gmock/gmock.h>

#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <memory>
#include <new>
#include <stdexcept>
#include <string>
#include <thread>
#include <type_traits>
#include <vector>

#include "support/Child.h"
#include "support/Faults.h"
#include "support/Sweep.h"
#include "util/Logger/EarlyLoggers.h"

// What loggers do before Logger::initialize, when it binds them, and beyond main. Each test runs in
// a process of its own, because initialisation happens once.

namespace {

using testing::HasSubstr;
using testsupport::ChildResult;
using testsupport::runInChild;

// Stands for a static object whose initialiser has not run yet.
Logger& unconstructedLogger() {
    alignas(Logger) static unsigned char raw[sizeof(Logger)] = {};
    return *reinterpret_cast<Logger*>(raw);
}

std::string errOf(const std::function<void()>& body) {
    const ChildResult result = runInChild([&] {
        body();
        return 0;
    });
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out, "");
    return result.err;
}

TEST(EarlyLoggersTest, AConstructedLoggerWritesBareMessagesOfInfoAndAbove) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  logger.debug("debug");
                  logger.info("x");
                  logger.warn("w %d", 1);
                  logger.error("e");
                  logger.crit("c");
                  logger.fatal("f");
              }),
              "x\nw 1\ne\nc\nf\n");
}

TEST(EarlyLoggersTest, ALoggerThatIsNotConstructedWritesBehindItsLevel) {
    EXPECT_EQ(errOf([] {
                  unconstructedLogger().debug("x");
                  unconstructedLogger().debug(std::string("%d"));
                  unconstructedLogger().fatal("%s", "f");
              }),
              "DEBUG - x\nDEBUG - %d\nFATAL - f\n");
}

TEST(EarlyLoggersTest, ItIsNotConstructedEvenWhereOthersAre) {
    EXPECT_EQ(errOf([] {
                  Logger other("other");
                  unconstructedLogger().debug("x");
              }),
              "DEBUG - x\n");
}

TEST(EarlyLoggersTest, OnceInitialisedItWritesToTheRootChannel) {
    EXPECT_EQ(errOf([] {
                  Logger::initialize();
                  unconstructedLogger().debug("dropped");
                  unconstructedLogger().info("x");
              }),
              "x\n");
}

TEST(EarlyLoggersTest, ChecksWhetherALoggerIsUsable) {
    EXPECT_EQ(runInChild([] {
                  Logger logger("a");
                  int seen = LogFormat::check_for_unitialized_logger(&logger) ? 1 : 0;
                  seen += LogFormat::check_for_unitialized_logger(&unconstructedLogger()) ? 10 : 0;
                  Logger::initialize();
                  seen += LogFormat::check_for_unitialized_logger(&logger) ? 100 : 0;
                  seen += LogFormat::check_for_unitialized_logger(&unconstructedLogger()) ? 100 : 0;
                  return seen;
              }).status,
              10);
}

TEST(EarlyLoggersTest, ALoggerIsNotLookedAtOnceItIsBound) {
    const unsigned count = 100000 * testsupport::testScale();
    const ChildResult result = runInChild([&] {
        LogChannel::find("early", true)->changeLevel("DEBUG");
        std::atomic<bool> built{false};
        std::thread owner([&] {
            std::vector<std::aligned_storage_t<sizeof(Logger), alignof(Logger)>> places(count);
            for (auto& place : places)
                new (&place) Logger("early");
            built = true;
            // The newest is bound first.
            for (auto place = places.rbegin(); place != places.rend(); ++place) {
                auto* const logger = reinterpret_cast<Logger*>(&*place);
                while (!logger->isDebugEnabled()) {
                }
                logger->~Logger();
                std::memset(static_cast<void*>(logger), 0x5A, sizeof *logger);
            }
        });
        while (!built) {
        }
        Logger::initialize();
        owner.join();
        return 0;
    });
    EXPECT_EQ(result.status, 0) << result.signal;
}

TEST(EarlyLoggersTest, ExceptionsAndTextsAreNotInterpreted) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  logger.warn(std::runtime_error("%d"));
                  logger.warn(std::string("%s %m"));
                  logger.crit(std::runtime_error("100%"));
              }),
              "%d\n%s %m\n100%\n");
}

TEST(EarlyLoggersTest, AnExceptionsTextMaySpoilErrno) {
    struct Spoiling : std::exception {
        const char* what() const noexcept override {
            errno = EIO;
            return "spoilt";
        }
    };
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  errno = ENOENT;
                  logger.warn(Spoiling());
                  EXPECT_EQ(errno, ENOENT);
                  logger.debug(Spoiling());
                  EXPECT_EQ(errno, ENOENT);
              }),
              "spoilt\n");
}

TEST(EarlyLoggersTest, PercentMIsTheErrnoOfTheCall) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  errno = ENOENT;
                  __extension__ logger.warn("%m");
                  __extension__ unconstructedLogger().warn("%m");
              }),
              "No such file or directory\nWARN - No such file or directory\n");
}

TEST(EarlyLoggersTest, ErrnoStaysAsItWas) {
    EXPECT_EQ(runInChild([] {
                  Logger logger("a");
                  const auto logAll = [&] {
                      logger.debug("dropped");
                      logger.info("x");
                      logger.info(std::string("x"));
                      logger.info(std::runtime_error("x"));
                      unconstructedLogger().info("x");
                      LogFormat::internal(nullptr, WARN, "x");
                      LogFormat::internal(nullptr, DEBUG, "x");
                  };
                  errno = 1234;
                  logAll();
                  close(2);  // and where every write fails
                  logAll();
                  return errno == 1234 ? 0 : 1;
              }).status,
              0);
}

TEST(EarlyLoggersTest, AMessageThatCannotBeFormattedIsDropped) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  const std::string text(300, 'x');
                  const testsupport::FailNth fault(testsupport::Call::new_array, 1, ENOMEM);
                  logger.warn("%s", text.c_str());
                  logger.warn("%s", "next");
                  EXPECT_TRUE(fault.fired());
              }),
              "next\n");
}

TEST(EarlyLoggersTest, AFilteredMessageIsNotFormatted) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  const std::string text(300, 'x');
                  const testsupport::CountCalls blocks(testsupport::Call::new_array);
                  logger.debug("%s", text.c_str());
                  EXPECT_EQ(blocks.count(), 0U);
              }),
              "");
}

TEST(EarlyLoggersTest, InitialisationBindsTheWaitingLoggersToTheirChannels) {
    EXPECT_EQ(errOf([] {
                  Logger configured("net");
                  Logger unknown("unknown");
                  Logger::setChannelLevel("net", "DEBUG");
                  configured.debug("before");
                  Logger::initialize();
                  configured.debug("net debug");
                  unknown.debug("dropped");
                  unknown.info("unknown info");
              }),
              "net debug\nunknown info\n");
}

TEST(EarlyLoggersTest, ALaterLoggerBindsAtOnce) {
    EXPECT_EQ(errOf([] {
                  Logger::initialize();
                  Logger before("net");
                  Logger::setChannelLevel("net", "DEBUG");
                  Logger after("net");
                  before.debug("bound to the root channel for good");
                  after.debug("net debug");
              }),
              "net debug\n");
}

TEST(EarlyLoggersTest, ALoggerThatIsGoneIsNotBound) {
    EXPECT_EQ(errOf([] {
                  auto first = std::make_unique<Logger>("1");
                  auto second = std::make_unique<Logger>("2");
                  auto third = std::make_unique<Logger>("3");
                  second.reset();
                  first->info("one");
                  third->info("three");
                  third.reset();
                  first->info("still one");
                  first.reset();
                  Logger::initialize();
              }),
              "one\nthree\nstill one\n");
}

TEST(EarlyLoggersTest, ACopyIsNotOnTheListAndMayGo) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  { const Logger copy(logger); }
                  logger.info("still early");
                  Logger::initialize();
                  logger.info("bound");
              }),
              "still early\nbound\n");
}

// What happens to a thread that builds a logger, or logs, while another one initialises.
TEST(EarlyLoggersTest, ALoggerThatComesToTheListTooLateIsBoundAtOnce) {
    EXPECT_EQ(errOf([] {
                  Logger late("a");
                  EarlyLoggers::remove(late);
                  Logger::setChannelLevel("a", "DEBUG");
                  Logger::initialize();
                  late.debug("dropped");
                  EarlyLoggers::add(late);
                  late.debug("bound");
                  if (EarlyLoggers::isUnusable(late)) late.debug("unusable");
              }),
              "bound\n");
}

TEST(EarlyLoggersTest, TextsBelowTheLevelAreDropped) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  logger.debug(std::string("early"));
                  Logger::initialize();
                  logger.debug(std::string("late"));
                  logger.info(std::string("shown"));
              }),
              "shown\n");
}

TEST(EarlyLoggersTest, ALoggerMayBeAssignedToItself) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  Logger& self = logger;
                  logger = self;
                  Logger::initialize();
                  logger = self;
                  logger.info("x");
              }),
              "x\n");
}

TEST(EarlyLoggersTest, InitialisingTwiceIsAnAssertion) {
    const ChildResult result = runInChild([] {
        Logger::initialize();
        Logger::initialize();
        return 0;
    });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(result.err,
                testing::MatchesRegex(
                    "src/util/Logger/.*:[0-9]+: failed assertion `!logger_initialized'\n"));
}

TEST(EarlyLoggersTest, TheRootLevelIsSetByTheNullChannel) {
    EXPECT_EQ(errOf([] {
                  Logger logger("a");
                  EXPECT_FALSE(logger.isDebugEnabled());
                  if (!Logger::setChannelLevel(nullptr, "DEBUG")) return;
                  logger.debug(logger.isDebugEnabled() ? "enabled" : "not enabled");
                  Logger::setChannelLevel(nullptr, "NOTICE");
                  logger.info("dropped");
                  Logger::setChannelLevel(nullptr, "EMERG");
                  logger.fatal("dropped");
              }),
              "enabled\n");
}

TEST(EarlyLoggersTest, AWordThatIsNoLevelChangesNothing) {
    EXPECT_EQ(runInChild([] {
                  for (const char* word : {"debug", "Debug", "DEBUG ", "", "???", "WARNING"}) {
                      if (Logger::setChannelLevel(nullptr, word)) return 1;
                      if (Logger::setChannelLevel("x", word)) return 2;
                  }
                  return 0;
              }).status,
              0);
}

TEST(EarlyLoggersTest, ACopyHasTheSameNameAndChannel) {
    EXPECT_EQ(errOf([] {
                  Logger::setChannelLevel("net", "DEBUG");
                  Logger::initialize();
                  const Logger net("net");
                  Logger copy(net);
                  copy.debug("copied");
                  Logger assigned("other");
                  assigned = net;
                  assigned.debug("assigned");
                  EXPECT_STREQ(assigned.getChannelName(), "net");
              }),
              "copied\nassigned\n");
}

TEST(EarlyLoggersTest, AssigningToAWaitingLoggerKeepsItWaiting) {
    EXPECT_EQ(errOf([] {
                  Logger last("last");
                  Logger waiting("x");
                  Logger first("first");
                  Logger::setChannelLevel("net", "DEBUG");
                  Logger source("net");
                  waiting = source;
                  Logger::initialize();
                  waiting.debug("bound by its new name");
                  last.info("last");
                  first.info("first");
              }),
              "bound by its new name\nlast\nfirst\n");
}

TEST(EarlyLoggersTest, InternalMessagesPassFromInfoOnWhateverTheRootSays) {
    EXPECT_EQ(errOf([] {
                  Logger::setChannelLevel(nullptr, "EMERG");
                  LogFormat::internal(nullptr, DEBUG, "dropped");
                  LogFormat::internal(nullptr, INFO, "%s", "told");
              }),
              "told\n");
}

TEST(EarlyLoggersTest, OnceBoundInternalMessagesFollowTheChannelLogger) {
    EXPECT_EQ(errOf([] {
                  LogFormat::internal(nullptr, INFO, "early");
                  Logger::setChannelLevel("Logger", "ERROR");
                  Logger::initialize();
                  LogFormat::internal(nullptr, WARN, "dropped");
                  LogFormat::internal(nullptr, ERROR, "told");
              }),
              "early\ntold\n");
}

TEST(EarlyLoggersTest, AReportThatMustNotGoToTheRootAppenderGoesToStandardErrorDirectly) {
    EXPECT_EQ(errOf([] {
                  const LogAppender* const root = LogAppender::find("rootAppender", false);
                  errno = EACCES;
                  __extension__ LogFormat::internal(root, CRIT, "it: %m");
              }),
              "CRIT - it: Permission denied\n");
}

TEST(EarlyLoggersTest, ThreadsThatStartEarlyMayBuildAndUseLoggers) {
    EXPECT_EQ(errOf([] {
                  std::vector<std::thread> threads;
                  for (int t = 0; t < 4; ++t) {
                      threads.emplace_back([] {
                          for (int i = 0; i < 200; ++i) {
                              Logger logger("early");
                              logger.debug("dropped");
                              LogFormat::check_for_unitialized_logger(&logger);
                              Logger::setChannelLevel("early", "NOTICE");
                          }
                      });
                  }
                  Logger::initialize();
                  for (std::thread& thread : threads)
                      thread.join();
                  Logger after("early");
                  after.warn("after");
              }),
              "after\n");
}

TEST(EarlyLoggersTest, ExitHandlersAndStaticDestructorsMayLog) {
    const std::string err = errOf([] {
        static Logger logger("at exit");
        static const struct AtExit {
            ~AtExit() { logger.warn("static destructor"); }
        } object;
        std::atexit([] { logger.warn("exit handler"); });
        Logger::initialize();
    });
    EXPECT_EQ(err, "exit handler\nstatic destructor\n");
}

TEST(EarlyLoggersTest, ADestroyedStaticLoggerStillWrites) {
    const auto body = [](bool initialised) {
        return errOf([initialised] {
            static Logger* later = nullptr;
            static const struct AtExit {
                ~AtExit() { later->warn("after its end"); }
            } object;
            static Logger logger("gone");
            later = &logger;
            if (initialised) Logger::initialize();
        });
    };
    EXPECT_EQ(body(true), "after its end\n");
    EXPECT_EQ(body(false), "WARN - after its end\n");
}

}  // namespace
