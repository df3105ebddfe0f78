#include <gmock/gmock.h>

#include <string>
#include <vector>

#include "tools/LogcheckTool.h"

namespace {

using testing::IsEmpty;
using testsupport::LogcheckToolTest;

// Configurations that are unusual and right: a false alarm makes people look away.
class LogcheckSaneTest : public LogcheckToolTest {
  protected:
    void expectClean(const std::vector<std::string>& texts, const std::string& before = "",
                     const std::string& after = "\n") const {
        for (const std::string& text : texts)
            EXPECT_THAT(findings(before + text + after), IsEmpty()) << text;
    }
};

TEST_F(LogcheckSaneTest, Patterns) {
    expectClean({"%m%n", "%d %-5p [%t] %c - %m%n", "%d{ISO8601} %R %r %u %p %c %t %m%n",
                 "{\"time\":\"%d{%Y-%m-%dT%H:%M:%S.%l%z}\",\"level\":\"%p\",\"text\":\"%m\"}%n",
                 "{%d}{%t}{%c} %m%n", "<%p> %m%n", "%%%p%% 100%% %m%n",
                 "[%05r] (%.3p) %10.20c | %-40.40m|%n", "%m%n%n", "%n%m%n",
                 "%p: it's \"%m\" & <%c>; $%t @%R ~ ^ ` ! ? * + = , . / \\ | _%n",
                 "\"%p\" says %m%n", "\xC3\xA4%m\xE2\x82\xAC%n", "\033[1m%p\033[0m %m%n",
                 "%p\t%c\t%m%n", "%m %n", "%m in %c of %t at %p%n", "%mm%pp%n", "%.0c%m%n"},
                pattern);
}

TEST_F(LogcheckSaneTest, Dates) {
    expectClean({"%H:%M",
                 "%H:%M:%S,%l",
                 "%l",
                 "%S.%l",
                 "%Y%m%d-%H%M%S",
                 "%d.%m.%Y %H:%M",
                 "%m/%d/%y %I:%M %p",
                 "%A, %e. %B %Y",
                 "%c",
                 "%D %T",
                 "%F %T.%l",
                 "%s",
                 "%ss",
                 "%H h %M min %S s",
                 "%Hh%Mm%Ss",
                 "%Y-W%V-%u",
                 "%j of %Y",
                 "%a %d %b",
                 "'%y",
                 "week %U",
                 "%-d/%-m",
                 "%Ey %Od",
                 "%x %X",
                 "%Z %z",
                 "%C%y",
                 "%R",
                 "%k:%M",
                 "%H:%M (%m/%d)",
                 "%M:%S",
                 "%m",
                 "%M",
                 "%d %m",
                 "%d %M",
                 "%B at %H",
                 "at %H",
                 "%% %Y",
                 "%t%Y%n",
                 "%G",
                 "%h %d",
                 "DATE",
                 "ISO8601",
                 "ABSOLUTE",
                 ""},
                pattern + "%d{", "} %m%n\n");
}

TEST_F(LogcheckSaneTest, Files) {
    expectClean({"/var/log/a.log",
                 "${KORVEX_HOME}/log/a.log",
                 "${KORVEX_HOME}/a",
                 "/a b/c d.log",
                 "/var/log/a.log.1",
                 "/var/log/..a",
                 "/x/../a.log",
                 "//var//log//a.log",
                 "/dev/null",
                 "/dev/stderr",
                 "/dev/fd/2",
                 "/var/log/\xC3\xA4.log",
                 "/var/log/a=b,c;d.log",
                 "/var/log/100%/a",
                 "/a~",
                 "/o'clock.log",
                 "/a\"b\".log",
                 "/var/log/a.log-2007",
                 "/no/such/directory/a.log",
                 "\t /a.log",
                 "/KORVEX_HOME/a.log",
                 "/[a].{b}(c)<d>"},
                "rootCategory=INFO,A\nappender.A.fileName=");
}

TEST_F(LogcheckSaneTest, Limits) {
    expectClean({"maxFileSize=0", "maxFileSize=256\nappender.A.maxBackupIndex=1",
                 "maxFileSize=9223372036854775807\nappender.A.maxBackupIndex=1000",
                 "maxFileSize=1048576\nappender.A.maxBackupIndex=0", "maxBackupIndex=0"},
                good + "appender.A.");
}

TEST_F(LogcheckSaneTest, WholeFiles) {
    const std::string a = "appender.A.fileName=/a.log\n";
    const std::string b = "appender.B.fileName=/b.log\n";
    expectClean(
        {"",
         "# nothing\n\n \t \n#",
         "<!-- nothing\n at all --> # <!--",
         "log4cpp.\nrootCategory=INFO",
         "rootCategory=DEBUG",
         "rootCategory=A\n" + a,
         "rootCategory=A WARN\n" + a,
         "rootCategory=,,INFO,\t,A,,\n" + a,
         "\t log4cpp.rootCategory \t = INFO , A   # comment\n" + a,
         a + "rootCategory=INFO,A",
         "category.x=INFO,A\ncategory.x.y=B\n" + a + b,
         "category.x.y.z = DEBUG\ncategory.x=WARN\ncategory.xy=WARN",
         "category.net::tcp/4-6_(a)@b=INFO",
         "category.\xC3\xBC=INFO",
         "category.levels=INFO\ncategory.a.levels=INFO\ncategory.warning=INFO",
         "category.rootkit=INFO\ncategory.network=INFO\ncategory.net=INFO",
         "rootCategory=INFO,rootAppender",
         "rootCategory=INFO,A,rootAppender\n" + a,
         "rootCategory=INFO,rootAppender\nappender.rootAppender=ConsoleAppender",
         "appender.rootAppender.layout=BasicLayout",
         "appender.rootAppender.layout=PatternLayout\n"
         "appender.rootAppender.layout.ConversionPattern=%p %m%n",
         "rootCategory=INFO,A\nappender.A=org.apache.log4j.RollingFileAppender\n" + a,
         "rootCategory=INFO,A\nappender.A=\n" + a,
         "rootCategory=INFO,info,off\nappender.info.fileName=/i\nappender.off.fileName=/o",
         "rootCategory=INFO,A-1_(x)\nappender.A-1_(x).fileName=/x",
         "rootCategory=INFO,A\nappender.A.fileName \t = /a.log",
         "rootCategory=INFO,A\nappender.A.fileName=/a<!-- x -->.log",
         "root<!-- in -->Category=INFO",
         "rootCategory=INFO,A,B\nappender.A.fileName=/dev/null\nappender.B.fileName=/dev/null",
         "rootCategory=INFO,A,B\n" + a + b + "appender.A.layout=SimpleLayout\n" +
             "appender.B.layout=SimpleLayout",
         "rootCategory=FATAL\ncategory.x=CRIT\ncategory.y=ERROR\ncategory.z=WARN"});
}

}  // namespace
