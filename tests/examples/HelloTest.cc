#include <gmock/gmock.h>

#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/TempDir.h"
#include "tools/ExecTool.h"

namespace {

using testing::HasSubstr;
using testsupport::ChildResult;
using testsupport::TempDir;
using testsupport::writeFile;

class HelloTest : public testing::Test {
  protected:
    HelloTest() {
        std::filesystem::create_directories(_dir.file("home/etc/myinstall"));
        std::filesystem::create_directories(_dir.file("db"));
        writeFile(_dir.file("home/etc/log-cmdline.cfg"), "log4cpp.rootCategory=INFO\n");
    }
    ChildResult run(const std::vector<std::string>& arguments, const std::string& db = "db") {
        return testsupport::runInChild([&] {
            setenv("KORVEX_HOME", _dir.file("home").c_str(), 1);
            setenv("KORVEX_DB", _dir.file(db).c_str(), 1);
            testsupport::execProgram(KORVEX_HELLO, arguments);
            return 127;
        });
    }

  private:
    const TempDir _dir;
};

TEST_F(HelloTest, GreetsItsComponent) {
    const ChildResult result = run({"-n", "world"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "hello, world\n");
}

TEST_F(HelloTest, SaysWhatIsWrongWithTheEnvironment) {
    const ChildResult result = run({}, "nowhere");
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.err, "The environment variable KORVEX_DB must point to an existing path.\n");
}

TEST_F(HelloTest, ShowsItsOptionsWhenItMeetsAnUnknownOne) {
    const ChildResult result = run({"--loud"});
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.err, HasSubstr("Bad Option --loud\n"));
    EXPECT_THAT(result.err, HasSubstr("--nodaemon"));
}

}  // namespace
