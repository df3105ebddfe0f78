#include <korvex/util/Logger.h>

#include <gmock/gmock.h>

#include <new>
#include <string>

#include "support/Child.h"
#include "support/Sweep.h"
#include "support/TempDir.h"

namespace {

using testing::UnorderedElementsAre;
using testsupport::Call;
using testsupport::ownStderr;
using testsupport::readFile;
using testsupport::sweep;
using testsupport::SweptFault;
using testsupport::TempDir;
using testsupport::writeFile;

// True when the configuration was read, false when reading ended without it.
bool initialize(const std::string& conf, SweptFault& fault) {
    bool read = false;
    fault.arm();
    try {
        read = Logger::initialize(Pathname(conf), Pathname("/opt"));
    } catch (const std::bad_alloc&) {
    }
    fault.disarm();
    return read;
}

TEST(ConfigurationSweep, LoggingGoesOnWhateverReadingTheConfigurationMet) {
    const TempDir dir;
    const std::string conf = dir.file("conf");
    std::string text = "<!-- a comment\n of two lines --> rootCategory=INFO,A,B # end\n";
    for (const char* name : {"A", "B", "C"}) {
        const std::string appender = std::string("appender.") + name;
        text += appender + "=File\n" + appender + ".fileName=" + dir.file(name) + "\n" + appender +
                ".maxFileSize=1000\n" + appender + ".layout.ConversionPattern=%d %p %m%n\n";
    }
    text += "category.one=DEBUG,C\ncategory.two=WARN\nnonsense\n";
    writeFile(conf, text);
    const auto swept =
        sweep("read a configuration",
              {Call::fopen, Call::fgets, Call::fclose, Call::open, Call::close,
               Call::pthread_mutex_lock, Call::allocation},
              [&](SweptFault& fault) {
                  Logger one("one");
                  const bool read = initialize(conf, fault);
                  if (fault.isOf(Call::fopen) && fault.fired()) {
                      EXPECT_FALSE(read);
                      EXPECT_NE(ownStderr().find("Couldn't open log file configuration"),
                                std::string::npos);
                  }
                  one.error("arrives");
                  EXPECT_NE((ownStderr() + readFile(dir.file("A")) + readFile(dir.file("B")) +
                             readFile(dir.file("C")))
                                .find("arrives"),
                            std::string::npos);
                  for (const char* name : {"A", "B", "C"})
                      Pathname(dir.file(name)).unlink();
              });
    EXPECT_THAT(swept.fired,
                UnorderedElementsAre(Call::fopen, Call::fgets, Call::fclose, Call::open,
                                     Call::close, Call::pthread_mutex_lock, Call::allocation));
    EXPECT_GT(swept.points, 100U);
}

}  // namespace
