#include <gmock/gmock.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testsupport::LogcheckToolTest;
using testsupport::writeFile;

class LogcheckFilesTest : public LogcheckToolTest {
  protected:
    // What is told of one appender's file.
    std::vector<std::string> told(const std::string& name) const {
        return findings("rootCategory=INFO,A\nappender.A.fileName=" + name + '\n');
    }
    std::string mended(const std::string& name) const {
        const std::string before = "rootCategory=INFO,A\nappender.A.fileName=";
        const std::string out = fixed(before + name + '\n');
        return out.substr(before.size(), out.size() - before.size() - 1);
    }
    std::vector<std::string> toldOfTwo(const std::string& a, const std::string& b,
                                       const std::string& more = "") const {
        return findings("rootCategory=INFO,A,B\nappender.A.fileName=" + a +
                        "\nappender.B.fileName=" + b + '\n' + more);
    }
};

TEST_F(LogcheckFilesTest, ARelativeNameDependsOnWhereTheProgramStarts) {
    EXPECT_THAT(told("log/a.log"),
                ElementsAre("2:21: warning: fileName \"log/a.log\" is relative: the file is where "
                            "the program happens to be started; did you mean "
                            "\"${KORVEX_HOME}/log/a.log\"? [file.relative]"));
    const auto meant = [&](const std::string& name) {
        const std::string line = told(name).at(0);
        return line.substr(std::min(line.find("; did"), line.rfind(" [")));
    };
    EXPECT_EQ(meant("././a.log"), "; did you mean \"${KORVEX_HOME}/a.log\"? [file.relative]");
    for (const std::string name : {"../a.log", "C:\\a.log", "file:///a.log"})
        EXPECT_EQ(meant(name), " [file.relative]");
}

TEST_F(LogcheckFilesTest, WhatIsNotReplaced) {
    const std::string only =
        "2:21: warning: only ${KORVEX_HOME}, and only in front, is replaced; the rest stays as "
        "written: ";
    EXPECT_THAT(told("${HOME}/b.log"), ElementsAre(only + "\"${HOME}/b.log\" [file.variable]"));
    EXPECT_THAT(told("~/b.log"), ElementsAre(only + "\"~/b.log\" [file.variable]"));
    EXPECT_THAT(told("/b-%Y.log"), ElementsAre(only + "\"/b-%Y.log\" [file.variable]"));
    EXPECT_THAT(told("${KORVEX_HOME}/${x}"), ElementsAre(only + "\"/${x}\" [file.variable]"));
    EXPECT_THAT(told("/100%/b~.log"), IsEmpty());
}

TEST_F(LogcheckFilesTest, OtherFormsOfTheHome) {
    EXPECT_THAT(told("$KORVEX_HOME/b.log"),
                ElementsAre("2:21: warning: the home is ${KORVEX_HOME}; \"$KORVEX_HOME\" is not "
                            "replaced; did you mean \"${KORVEX_HOME}\"? [file.home]"));
    for (const std::string form :
         {"$KORVEX_HOME", "%KORVEX_HOME%", "$(KORVEX_HOME)", "${korvex_home}"}) {
        EXPECT_EQ(mended(form + "/b.log"), "${KORVEX_HOME}/b.log");
    }
    for (const std::string form : {"${KORVEX_HOME", "{KORVEX_HOME}", "<KORVEX_HOME>",
                                   "@KORVEX_HOME@", "KORVEX_HOME", "${env:KORVEX_HOME}"}) {
        EXPECT_EQ(mended(form + "/b.log"), "${KORVEX_HOME}/b.log") << form;
    }
    EXPECT_EQ(mended("$KORVEX_HOMES/b.log"), "$KORVEX_HOMES/b.log");
    EXPECT_EQ(mended("${KORVEX_HOME:-/opt}/b.log"), "${KORVEX_HOME:-/opt}/b.log");
    EXPECT_EQ(mended("korvex_home/b.log"), "korvex_home/b.log");
    EXPECT_THAT(told("${KORVEXHOME}/b.log"),
                ElementsAre(testing::EndsWith("\"${KORVEXHOME}/b.log\"; did you mean "
                                              "\"${KORVEX_HOME}/b.log\"? [file.variable]")));
    EXPECT_THAT(told("${KORVEX_HOME}log/c.log"),
                ElementsAre("2:35: warning: no \"/\" between ${KORVEX_HOME} and \"log/c.log\"; did "
                            "you mean \"${KORVEX_HOME}/log/c.log\"? [file.home]"));
    EXPECT_THAT(told("${KORVEX_HOME}.log"),
                ElementsAre("2:35: warning: no \"/\" between ${KORVEX_HOME} and \".log\" "
                            "[file.home]"));
}

TEST_F(LogcheckFilesTest, QuotationMarksBelongToTheName) {
    EXPECT_THAT(told("\"/a.log\""),
                ElementsAre("2:21: warning: the quotation marks belong to the name: \"/a.log\"; "
                            "did you mean \"/a.log\"? [file.quoted]"));
    EXPECT_EQ(mended("'\"/a.log\"'"), "/a.log");
    EXPECT_THAT(told("/a.log\""),
                ElementsAre("2:21: warning: the quotation mark belongs to the name: /a.log\"; did "
                            "you mean \"/a.log\"? [file.quoted]"));
    EXPECT_EQ(mended("\"/a.log"), "/a.log");
    EXPECT_EQ(mended("\"\""), "");
}

TEST_F(LogcheckFilesTest, ADirectoryIsNoFile) {
    EXPECT_THAT(told("${KORVEX_HOME}"),
                ElementsAre("2:21: warning: this is the home itself, a "
                            "directory: no line is written [file.directory]"));
    EXPECT_THAT(told("${KORVEX_HOME}/"),
                ElementsAre("2:21: warning: this is the home itself, a "
                            "directory: no line is written [file.directory]"));
    EXPECT_THAT(told("/no/such/"), ElementsAre("2:21: warning: \"/no/such/\" names a directory: no "
                                               "line is written [file.directory]"));
    EXPECT_THAT(told("/no/such/.."),
                ElementsAre("2:21: warning: \"/no/such/..\" names a directory: "
                            "no line is written [file.directory]"));
    EXPECT_THAT(told(dir.path()),
                ElementsAre("2:21: warning: \"" + dir.path() +
                            "\" names a directory: no line is written [file.directory]"));
    EXPECT_THAT(told("/no/such/..."), IsEmpty());
}

TEST_F(LogcheckFilesTest, OneFileOfTwoAppenders) {
    EXPECT_THAT(toldOfTwo("/d.log", "/d.log"),
                ElementsAre("3:21: warning: Appender \"B\" writes to the same file as \"A\"; "
                            "their lines are mixed there [file.same]"));
    EXPECT_THAT(
        toldOfTwo("/d.log", "/d.log", "appender.B.maxFileSize=4096\nappender.B.maxBackupIndex=1\n"),
        ElementsAre("3:21: warning: Appender \"B\" writes to the same file as \"A\"; each "
                    "rotates it by itself [file.same]"));
    EXPECT_THAT(toldOfTwo("/no/such/d.log", "/no/./x/..//such/d.log"),
                ElementsAre("3:21: warning: Appender \"B\" writes to the same file as \"A\", "
                            "which calls it \"/no/such/d.log\"; their lines are mixed there "
                            "[file.same]"));
    EXPECT_THAT(toldOfTwo("/no/such/d.log", "/no/such/D.log"), IsEmpty());
    EXPECT_THAT(toldOfTwo("/dev/null", "/dev/null"), IsEmpty());
}

TEST_F(LogcheckFilesTest, OneFileByLinks) {
    ASSERT_EQ(symlink(".", dir.file("here").c_str()), 0);
    EXPECT_THAT(toldOfTwo(dir.file("a.log"), dir.file("here/a.log")),
                ElementsAre(testing::EndsWith("[file.same]")));
    writeFile(dir.file("a.log"), "");
    ASSERT_EQ(link(dir.file("a.log").c_str(), dir.file("b.log").c_str()), 0);
    EXPECT_THAT(toldOfTwo(dir.file("a.log"), dir.file("b.log")),
                ElementsAre(testing::EndsWith("[file.same]")));
}

TEST_F(LogcheckFilesTest, LinksToWhatIsNotThereYet) {
    ASSERT_EQ(symlink("none.log", dir.file("a.log").c_str()), 0);
    ASSERT_EQ(symlink((dir.path() + "/./none.log").c_str(), dir.file("b.log").c_str()), 0);
    EXPECT_THAT(toldOfTwo(dir.file("a.log"), dir.file("b.log")),
                ElementsAre(testing::EndsWith("[file.same]")));
    ASSERT_EQ(symlink("loop", dir.file("loop").c_str()), 0);
    EXPECT_THAT(toldOfTwo(dir.file("loop"), dir.file("a.log")), IsEmpty());
}

// A rotation renames the link, and leaves what it leads to alone.
TEST_F(LogcheckFilesTest, ABackupOfALink) {
    const std::string limits = "appender.A.maxFileSize=4096\nappender.A.maxBackupIndex=3\n";
    std::filesystem::create_directory(dir.file("data"));
    writeFile(dir.file("data/real.log"), "");
    ASSERT_EQ(symlink("data/real.log", dir.file("a.log").c_str()), 0);
    ASSERT_EQ(symlink("a.log.2", dir.file("alias.log").c_str()), 0);
    for (const std::string name : {"a.log.1", "alias.log"}) {
        EXPECT_THAT(toldOfTwo(dir.file("a.log"), dir.file(name), limits),
                    ElementsAre(testing::EndsWith("[file.backup]")));
    }
    EXPECT_THAT(toldOfTwo(dir.file("a.log"), dir.file("data/real.log.1"), limits), IsEmpty());
}

TEST_F(LogcheckFilesTest, AFileThatIsAnothersBackup) {
    const std::string limits = "appender.A.maxFileSize=4096\nappender.A.maxBackupIndex=3\n";
    EXPECT_THAT(toldOfTwo("/no/a.log", "/no/x/../a.log.3", limits),
                ElementsAre("3:21: warning: this is backup 3 of \"A\", whose rotation renames and "
                            "overwrites it [file.backup]"));
    for (const std::string name : {"/no/a.log.4", "/no/a.log.0", "/no/a.log.01", "/no/a.log.x",
                                   "/no/a.log.", "/no/b.log.1", "/no/a.log.99999999999999999999"}) {
        EXPECT_THAT(toldOfTwo("/no/a.log", name, limits), IsEmpty()) << name;
    }
    EXPECT_THAT(toldOfTwo("/no/a.log", "/no/a.log.1"), IsEmpty());
}

TEST_F(LogcheckFilesTest, AnOrderThatDoesNotMatter) {
    EXPECT_THAT(toldOfTwo("/no/b.log.1", "/no/b.log",
                          "appender.B.maxFileSize=4096\nappender.B.maxBackupIndex=1\n"),
                ElementsAre("2:21: warning: this is backup 1 of \"B\", whose rotation renames and "
                            "overwrites it [file.backup]"));
}

TEST_F(LogcheckFilesTest, AFileSizeOfALineOrSo) {
    const std::string backups = "appender.A.maxBackupIndex=2\n";
    EXPECT_THAT(findings(good + "appender.A.maxFileSize=10\n" + backups),
                ElementsAre("3:24: warning: maxFileSize is in bytes: the file is rotated after "
                            "nearly every line; did you mean \"10485760\"? [limit.small]"));
    EXPECT_THAT(codes(good + "appender.A.maxFileSize=255\n" + backups), ElementsAre("limit.small"));
    EXPECT_THAT(findings(good + "appender.A.maxFileSize=256\n" + backups), IsEmpty());
    EXPECT_THAT(findings(good + "appender.A.maxFileSize=0\n"), IsEmpty());
}

TEST_F(LogcheckFilesTest, AFileSizeWithoutBackups) {
    EXPECT_THAT(findings(good + "appender.A.maxFileSize=4096\n"),
                ElementsAre("3:24: warning: there is no maxBackupIndex: beyond 4096 bytes the "
                            "file begins again empty, and what it held is lost "
                            "[limit.no-backup]"));
    EXPECT_THAT(findings(good + "appender.A.maxFileSize=4096\nappender.A.maxBackupIndex=0\n"),
                IsEmpty());
}

TEST_F(LogcheckFilesTest, MoreBackupsThanAnybodyHas) {
    const std::string size = good + "appender.A.maxFileSize=4096\nappender.A.maxBackupIndex=";
    EXPECT_THAT(findings(size + "1001\n"),
                ElementsAre("4:27: warning: 1001 backups are more than anybody has: the number is "
                            "how many files are kept, and each is renamed at every rotation "
                            "[limit.backups]"));
    EXPECT_THAT(findings(size + "1000\n"), IsEmpty());
}

TEST_F(LogcheckFilesTest, LimitsThatCannotWork) {
    EXPECT_THAT(findings("rootCategory=A\nappender.A=x\nappender.A.maxFileSize=4096\n"
                         "appender.A.maxBackupIndex=1\n"),
                ElementsAre("2:1: warning: Appender \"A\" has no filename, assuming stderr "
                            "[appender.no-file]",
                            "3:12: warning: Appender \"A\" has maxSize set without specifying a "
                            "filename, ignoring [limit.no-file]",
                            "4:12: warning: Appender \"A\" has maxBackupIndex set without "
                            "specifying a filename, ignoring [limit.no-file]"));
    EXPECT_THAT(findings(good + "appender.A.maxBackupIndex=1\n"),
                ElementsAre("3:12: warning: Appender \"A\" has maxBackupIndex set without "
                            "specifying maxSize, ignoring [limit.no-size]"));
    EXPECT_THAT(codes(good + "appender.A.maxFileSize=18446744073709551615\n"
                             "appender.A.maxBackupIndex=1\n"),
                ElementsAre("limit.huge"));
}

TEST_F(LogcheckFilesTest, ANumberWithAUnitSaysTheNumber) {
    EXPECT_THAT(findings(good + "appender.A.maxFileSize=10MB\nappender.A.maxBackupIndex=0\n"),
                ElementsAre("3:24: error: Parse error at \"appender.A.maxFileSize=10MB\": "
                            "\"10MB\" is not a plain number; use digits only; the "
                            "unit is the byte; did you mean \"10485760\"? [number.unit]"));
    const auto number = [&](const std::string& text) {
        const std::string before = good + "appender.A.maxFileSize=";
        const std::string out = fixed(before + text + '\n');
        return out.substr(before.size(), out.size() - before.size() - 1);
    };
    EXPECT_EQ(number("10 MB"), "10485760");
    EXPECT_EQ(number("10m"), "10485760");
    EXPECT_EQ(number("10MiB"), "10485760");
    EXPECT_EQ(number("1k"), "1024");
    EXPECT_EQ(number("2 GB"), "2147483648");
    EXPECT_EQ(number("4096 bytes"), "4096");
    EXPECT_EQ(number("1,000,000"), "1000000");
    EXPECT_EQ(number("1'000"), "1000");
    EXPECT_EQ(number("+4096"), "4096");
    EXPECT_EQ(number("004096"), "4096");
    EXPECT_EQ(number("\"4096\""), "4096");
    EXPECT_EQ(number("'10 megabytes'"), "10485760");
    for (const std::string text : {"-1", "ten", "1.5MB", "1,00", "1,0000", "1,000'000", "10 MBit",
                                   "0x400", "9223372036854775808k", "99999999TB"}) {
        EXPECT_EQ(number(text), text);
    }
    EXPECT_EQ(number("8388607TB"), "9223370937343148032");
}

TEST_F(LogcheckFilesTest, AUnitIsNothingForANumberOfBackups) {
    EXPECT_THAT(findings(good + "appender.A.maxFileSize=4096\nappender.A.maxBackupIndex=5k\n"),
                ElementsAre("4:27: error: Parse error at \"appender.A.maxBackupIndex=5k\": \"5k\" "
                            "is not a plain number; use digits only "
                            "[number.form]"));
}

TEST_F(LogcheckFilesTest, ABlankBehindAValue) {
    EXPECT_THAT(
        findings(good + "appender.A.maxFileSize=4096 # bytes\nappender.A.maxBackupIndex=1#x\n"
                        "appender.A.layout=BasicLayout \n"),
        ElementsAre(
            "3:24: error: Parse error at \"appender.A.maxFileSize=4096 \": \"4096 \" is "
            "not a plain number; a blank or \"#\" after it is part of the value; did you mean "
            "\"4096\"? [value.refused-tail]",
            "4:27: error: Parse error at \"appender.A.maxBackupIndex=1#\": \"1#\" is not a "
            "plain number; a blank or \"#\" after it is part of the value; did you mean \"1\"? "
            "[value.refused-tail]",
            "5:19: error: Parse error at \"appender.A.layout=BasicLayout \": "
            "\"BasicLayout \" is not a layout; a blank or \"#\" after it is part of the value; did "
            "you mean \"BasicLayout\"? [value.refused-tail]"));
    EXPECT_EQ(fixed(good + "appender.A.maxFileSize=4096 # bytes\nappender.A.maxBackupIndex=1#x\n"
                           "appender.A.layout=BasicLayout   \n"),
              good +
                  "# bytes\nappender.A.maxFileSize=4096\n#x\nappender.A.maxBackupIndex=1\n"
                  "appender.A.layout=BasicLayout\n");
}

TEST_F(LogcheckFilesTest, AValueThatKeepsWhatIsBehindIt) {
    EXPECT_THAT(findings("rootCategory=A,B \n"
                         "appender.A.fileName=/a.log # here\n"
                         "appender.B.fileName=/b.log# here\n"
                         "appender.B.layout.ConversionPattern=%m%n\t\n"),
                ElementsAre("2:27: warning: fileName keeps the blank after it: \"/a.log \"; did "
                            "you mean \"/a.log\"? [value.tail]",
                            "3:27: warning: fileName keeps the \"#\" that follows it directly: "
                            "\"/b.log#\"; did you mean \"/b.log\"? [value.tail]",
                            "4:41: warning: layout.ConversionPattern keeps the blank after it: "
                            "\"%m%n\\x09\"; did you mean \"%m%n\"? [value.tail]"));
    EXPECT_EQ(fixed("rootCategory=A\nappender.A.fileName=/a.log # here\n"),
              "rootCategory=A\n# here\nappender.A.fileName=/a.log\n");
    EXPECT_EQ(fixed(pattern + "%n%m \n"), pattern + "%n%m \n");
}

TEST_F(LogcheckFilesTest, LayoutsWithAClassInFrontOrMisspelt) {
    const std::string layouts = "the layouts are BasicLayout, SimpleLayout and PatternLayout";
    EXPECT_THAT(
        findings(good + "appender.A.layout=org.apache.log4j.SimpleLayout\n"
                        "appender.A.layout=basiclayout\nappender.A.layout=TTCCLayout\n"),
        ElementsAre("3:19: error: Parse error at "
                    "\"appender.A.layout=org.apache.log4j.SimpleLayout\": " +
                        layouts +
                        ", without a class in front; did you mean \"SimpleLayout\"? "
                        "[layout.class]",
                    "4:19: error: Parse error at \"appender.A.layout=basiclayout\": " + layouts +
                        "; did you mean \"BasicLayout\"? [layout.case]",
                    "5:19: error: Parse error at \"appender.A.layout=TTCCLayout\": " + layouts +
                        " [layout.unknown]"));
    EXPECT_EQ(fixed(good + "appender.A.layout=log4cpp::SimpleLayout # x\nappender.A.layout=basic\n"
                           "appender.A.layout=org.x.XMLLayout\n"),
              good +
                  "# x\nappender.A.layout=SimpleLayout\nappender.A.layout=BasicLayout\n"
                  "appender.A.layout=org.x.XMLLayout\n");
    EXPECT_THAT(codes(good + "appender.A.layout=SimpelLayout\n"), ElementsAre("layout.unknown"));
}

}  // namespace
