#include <gmock/gmock.h>
#include <grp.h>
#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testsupport::ChildResult;
using testsupport::execLogcheck;
using testsupport::LogcheckToolTest;
using testsupport::runInChild;
using testsupport::writeFile;

// As "nobody" through --user where the tests run as root, else as who runs them.
class LogcheckPathsTest : public LogcheckToolTest {
  protected:
    LogcheckPathsTest() {
        EXPECT_EQ(chmod(dir.path().c_str(), 0755), 0);
        EXPECT_EQ(mkdir(log.c_str(), 0777), 0);
        EXPECT_EQ(chmod(log.c_str(), 0777), 0);
    }
    std::vector<std::string> told(const std::string& name, const std::string& limits = "") const {
        std::vector<std::string> arguments = {"--paths"};
        if (isRoot) arguments.insert(arguments.end(), {"--user", "nobody"});
        std::vector<std::string> all =
            findings("rootCategory=INFO,A\nappender.A.fileName=" + name + '\n' + limits, arguments);
        const std::string who = isRoot ? " (as user nobody)" : "";
        for (std::string& line : all) {
            const std::size_t at = line.rfind(who + " [");
            EXPECT_NE(at, line.npos) << line;
            line.erase(at, who.size());
        }
        return all;
    }

    const bool isRoot = geteuid() == 0;
    const std::string log = dir.file("log");
    const std::string rotated = "appender.A.maxFileSize=4096\nappender.A.maxBackupIndex=1\n";
};

TEST_F(LogcheckPathsTest, AFileThatCanBeMadeOrWrittenIsClean) {
    EXPECT_THAT(told(log + "/a.log", rotated), IsEmpty());
    EXPECT_FALSE(std::filesystem::exists(log + "/a.log"));
    writeFile(log + "/a.log", "x");
    ASSERT_EQ(chmod((log + "/a.log").c_str(), 0666), 0);
    EXPECT_THAT(told(log + "/a.log", rotated), IsEmpty());
    EXPECT_THAT(told("/dev/null"), IsEmpty());
}

TEST_F(LogcheckPathsTest, ADirectoryThatIsMissing) {
    EXPECT_THAT(told(log + "/x/y/a.log"),
                ElementsAre("2:21: error: there is no directory \"" + log +
                            "/x\": no line is written [path.missing]"));
    EXPECT_THAT(told("/no-such-directory/a.log"),
                ElementsAre("2:21: error: there is no directory \"/no-such-directory\": no line is "
                            "written [path.missing]"));
}

TEST_F(LogcheckPathsTest, WithoutTheOptionTheMachineIsNotLookedAt) {
    EXPECT_THAT(findings("rootCategory=INFO,A\nappender.A.fileName=/no-such-directory/a.log\n"),
                IsEmpty());
}

TEST_F(LogcheckPathsTest, AFileWhereADirectoryIsMeant) {
    writeFile(log + "/file", "");
    EXPECT_THAT(told(log + "/file/a.log"), ElementsAre("2:21: error: \"" + log +
                                                       "/file\" is no directory "
                                                       "[path.no-directory]"));
    EXPECT_THAT(told(log + "/file/x/a.log"), ElementsAre("2:21: error: \"" + log +
                                                         "/file/x\" is no directory "
                                                         "[path.no-directory]"));
}

TEST_F(LogcheckPathsTest, ADirectoryWhereAFileIsMeant) {
    std::vector<std::string> arguments = {"--paths"};
    EXPECT_THAT(findings("rootCategory=INFO,A\nappender.A.fileName=" + log + '\n', arguments),
                ElementsAre(testing::EndsWith("[file.directory]"),
                            "2:21: error: \"" + log + "\" is a directory [path.no-directory]"));
}

TEST_F(LogcheckPathsTest, RightsThatAreMissing) {
    ASSERT_EQ(chmod(log.c_str(), 0555), 0);
    EXPECT_THAT(told(log + "/a.log"), ElementsAre("2:21: error: no file can be made in \"" + log +
                                                  "\": Permission denied [path.denied]"));
    ASSERT_EQ(chmod(log.c_str(), 0777), 0);
    writeFile(log + "/a.log", "");
    ASSERT_EQ(chmod((log + "/a.log").c_str(), 0444), 0);
    EXPECT_THAT(told(log + "/a.log"), ElementsAre("2:21: error: \"" + log +
                                                  "/a.log\" cannot be written: Permission denied "
                                                  "[path.denied]"));
    ASSERT_EQ(chmod(log.c_str(), 0700), 0);
    if (isRoot) {
        EXPECT_THAT(told(log + "/a.log"),
                    ElementsAre("2:21: error: \"" + log +
                                "/a.log\" cannot be reached: Permission denied [path.denied]"));
    }
}

TEST_F(LogcheckPathsTest, AFileThatCanBeWrittenButNotRenamed) {
    writeFile(log + "/a.log", "");
    ASSERT_EQ(chmod((log + "/a.log").c_str(), 0666), 0);
    ASSERT_EQ(chmod(log.c_str(), 0555), 0);
    EXPECT_THAT(told(log + "/a.log", rotated),
                ElementsAre("2:21: warning: nothing can be renamed in \"" + log +
                            "\": Permission denied; the file grows beyond maxFileSize "
                            "[path.no-rotation]"));
    EXPECT_THAT(told(log + "/a.log"), IsEmpty());
}

// As in /tmp, where only the owner of a file renames it.
TEST_F(LogcheckPathsTest, AFileOfSomebodyElseWhereOnlyOwnersRename) {
    if (!isRoot) GTEST_SKIP() << "only root gives files away";
    writeFile(log + "/a.log", "");
    ASSERT_EQ(chmod((log + "/a.log").c_str(), 0666), 0);
    ASSERT_EQ(chmod(log.c_str(), 01777), 0);
    EXPECT_THAT(
        told(log + "/a.log", rotated),
        ElementsAre("2:21: warning: \"" + log +
                    "/a.log\" cannot be renamed: only its owner can, in this directory; the "
                    "file grows beyond maxFileSize [path.no-rotation]"));
    EXPECT_THAT(told(log + "/a.log"), IsEmpty());
    EXPECT_THAT(told(log + "/b.log", rotated), IsEmpty());
    const struct passwd* const nobody = getpwnam("nobody");
    ASSERT_EQ(chown((log + "/a.log").c_str(), nobody->pw_uid, 0), 0);
    EXPECT_THAT(told(log + "/a.log", rotated), IsEmpty());
}

TEST_F(LogcheckPathsTest, ALinkThatCannotBeRenamed) {
    ASSERT_EQ(mkdir((log + "/links").c_str(), 0755), 0);
    ASSERT_EQ(symlink("../b.log", (log + "/links/a.log").c_str()), 0);
    ASSERT_EQ(chmod((log + "/links").c_str(), 0555), 0);
    EXPECT_THAT(told(log + "/links/a.log", rotated),
                ElementsAre(testing::EndsWith("[path.no-rotation]")));
    EXPECT_THAT(told(log + "/links/a.log"), IsEmpty());
}

TEST_F(LogcheckPathsTest, ALinkToWhatIsNotThereYet) {
    ASSERT_EQ(symlink("../none/b.log", (log + "/a.log").c_str()), 0);
    EXPECT_THAT(told(log + "/a.log"), ElementsAre(HasSubstr("[path.missing]")));
    ASSERT_EQ(unlink((log + "/a.log").c_str()), 0);
    ASSERT_EQ(symlink("b.log", (log + "/a.log").c_str()), 0);
    EXPECT_THAT(told(log + "/a.log"), IsEmpty());
    ASSERT_EQ(symlink("b.log", (log + "/b.log").c_str()), 0);
    EXPECT_THAT(told(log + "/a.log"),
                ElementsAre("2:21: error: \"" + log +
                            "/a.log\" cannot be reached: Too many levels of symbolic links "
                            "[path.denied]"));
}

TEST_F(LogcheckPathsTest, AHomeThatIsNotKnown) {
    EXPECT_THAT(
        findings("rootCategory=INFO,A\nappender.A.fileName=${KORVEX_HOME}/a.log\n", {"--paths"}),
        ElementsAre("2:21: error: the home is not known: give it by --home or KORVEX_HOME "
                    "[path.missing]"));
}

// The groups of the user count: a file of a group that nobody is in, and one of its own.
TEST_F(LogcheckPathsTest, TheUsersGroupsCount) {
    if (!isRoot) GTEST_SKIP() << "only root gives files away";
    const struct passwd* const nobody = getpwnam("nobody");
    ASSERT_NE(nobody, nullptr);
    writeFile(log + "/a.log", "");
    ASSERT_EQ(chown((log + "/a.log").c_str(), 0, nobody->pw_gid), 0);
    ASSERT_EQ(chmod((log + "/a.log").c_str(), 0660), 0);
    EXPECT_THAT(told(log + "/a.log"), IsEmpty());
    ASSERT_EQ(chown((log + "/a.log").c_str(), 0, 0), 0);
    const ChildResult result = runInChild([&] {
        const gid_t roots = 0;
        if (setgroups(1, &roots) != 0) return 1;
        execLogcheck({"-q", "--paths", "--user", "nobody", file});
        return 127;
    });
    EXPECT_THAT(result.out, HasSubstr("[path.denied]"));
}

TEST_F(LogcheckPathsTest, EachAppendersProblemStandsAtItsOwnLine) {
    const std::vector<std::string> all = findings(
        "rootCategory=INFO,A,B,C\nappender.A.fileName=/no-such-a/x\nappender.B.fileName=" + log +
            "/b\n\nappender.C.fileName=/no-such-c/x\n",
        {"--paths"});
    EXPECT_THAT(
        all, ElementsAre(testing::StartsWith("2:21: error: there is no directory \"/no-such-a"),
                         testing::StartsWith("5:21: error: there is no directory \"/no-such-c")));
}

TEST_F(LogcheckPathsTest, AUserThatThereIsNot) {
    const ChildResult result = check(good, {"--paths", "--user", "no-such-user"});
    EXPECT_EQ(result.err, "korvex-logcheck: cannot look as user no-such-user: there is none\n");
    EXPECT_EQ(result.status, 2);
}

TEST_F(LogcheckPathsTest, OnlyRootLooksAsSomebodyElse) {
    configure(good);
    ASSERT_EQ(chmod(file.c_str(), 0644), 0);
    const ChildResult result = runInChild([&] {
        const struct passwd* const nobody = getpwnam("nobody");
        if (geteuid() == 0 && (setgid(nobody->pw_gid) != 0 || setuid(nobody->pw_uid) != 0))
            return 1;
        execLogcheck({"--paths", "--user", "root", file});
        return 127;
    });
    EXPECT_EQ(result.err, "korvex-logcheck: cannot look as user root: only root can\n");
    EXPECT_EQ(result.status, 2);
}

}  // namespace
