#include <korvex/util/LoaderInfo.h>

#include <gmock/gmock.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <ctime>
#include <functional>
#include <new>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/Faults.h"
#include "support/TempDir.h"

namespace {

using testing::HasSubstr;
using testing::Not;
using testsupport::Call;
using testsupport::ChildResult;
using testsupport::CountCalls;
using testsupport::FailNth;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::writeFile;

// A record that has parsed "prog" and the arguments.
struct Parsed : LoaderInfo {
    explicit Parsed(const std::vector<const char*>& arguments) { parse(arguments); }
    void parse(const std::vector<const char*>& arguments) {
        std::vector<const char*> argv{"prog"};
        argv.insert(argv.end(), arguments.begin(), arguments.end());
        init(static_cast<int>(argv.size()), argv.data());
        populateFromCommandLine();
    }
};

TEST(LoaderInfoTest, BeforeInitEverythingIsEmpty) {
    LoaderInfo info;
    EXPECT_EQ(info.getKorvexHome(), "");
    EXPECT_EQ(info.getKorvexDb(), "");
    EXPECT_EQ(info.getComponentName(), "");
    EXPECT_EQ(info.getInstallName(), "");
    EXPECT_EQ(info.getStartupMode(), "");
    EXPECT_EQ(info.getHost(), "");
    EXPECT_EQ(info.getPort(), 0);
    EXPECT_EQ(info.getPid(), 0);
    EXPECT_EQ(info.getStartupTime(), 0);
    EXPECT_FALSE(info.getDebug() || info.getDaemon() || info.getUseDebugLog() || info.isError());
    info.populateFromCommandLine();
    info.printHelp();
    EXPECT_EQ(info.getPort(), 0);
}

TEST(LoaderInfoTest, InitSetsTheDefaults) {
    LoaderInfo info;
    const char* argv[] = {"prog", nullptr};
    const time_t before = time(nullptr);
    info.init(1, argv);
    EXPECT_EQ(info.getComponentName(), "korvexd");
    EXPECT_EQ(info.getInstallName(), "myinstall");
    EXPECT_EQ(info.getPort(), 8089);
    EXPECT_EQ(info.getPid(), getpid());
    EXPECT_LE(before, info.getStartupTime());
    EXPECT_LE(info.getStartupTime(), time(nullptr));
    EXPECT_TRUE(info.getDebug() && info.getDaemon());
    EXPECT_FALSE(info.getUseDebugLog());
    EXPECT_EQ(info.getStartupMode(), "");
}

TEST(LoaderInfoTest, ThereIsOneInstance) {
    EXPECT_NE(LoaderInfo::getInstance(), nullptr);
    EXPECT_EQ(LoaderInfo::getInstance(), LoaderInfo::getInstance());
}

TEST(LoaderInfoTest, AnEmptyArgumentVectorIsNoTrouble) {
    LoaderInfo info;
    const char* argv[] = {nullptr};
    info.init(0, argv);
    info.populateFromCommandLine();
    info.init(0, nullptr);
    info.populateFromCommandLine();
    EXPECT_FALSE(info.isError());
    EXPECT_EQ(info.getPort(), 8089);
}

TEST(LoaderInfoTest, TheSwitchesAreAlwaysRecomputed) {
    const Parsed nothing({});
    EXPECT_TRUE(!nothing.getDebug() && nothing.getDaemon() && !nothing.getUseDebugLog());
    const Parsed nodaemon({"--nodaemon"});
    EXPECT_TRUE(!nodaemon.getDebug() && !nodaemon.getDaemon() && !nodaemon.getUseDebugLog());
    EXPECT_EQ(nodaemon.getPort(), 8089);
    const Parsed noseg({"--noseg"});
    EXPECT_TRUE(noseg.getDebug() && noseg.getDaemon() && !noseg.getUseDebugLog());
    const Parsed debug({"--debug"});
    EXPECT_TRUE(!debug.getDebug() && debug.getDaemon() && debug.getUseDebugLog());
}

TEST(LoaderInfoTest, ValuesReplaceTheDefaults) {
    const Parsed info({"-c", "conf", "-h", "host", "-i", "inst", "-n", "comp", "-p", "9000",
                       "--mode", "standby"});
    EXPECT_EQ(info.getCommonConfigPath(), "/conf");
    EXPECT_EQ(info.getInstallConfigPath(), "/conf/inst");
    EXPECT_EQ(info.getHost(), "host");
    EXPECT_EQ(info.getInstallName(), "inst");
    EXPECT_EQ(info.getComponentName(), "comp");
    EXPECT_EQ(info.getPort(), 9000);
    EXPECT_EQ(info.getStartupMode(), "standby");
}

TEST(LoaderInfoTest, APortOfZeroIsNone) {
    EXPECT_EQ(Parsed({"-p", "0"}).getPort(), 8089);
    EXPECT_EQ(Parsed({"-p", "-5"}).getPort(), -5);
}

TEST(LoaderInfoTest, TheArgumentsAreCopied) {
    LoaderInfo info;
    {
        std::string name = "--mode=standby";
        const char* argv[] = {"prog", name.c_str(), nullptr};
        info.init(2, argv);
        name.assign(name.size(), 'x');
    }
    info.populateFromCommandLine();
    EXPECT_EQ(info.getStartupMode(), "standby");
}

TEST(LoaderInfoTest, AnUnknownOptionIsToldAndParsingGoesOn) {
    const ChildResult result = runInChild([] {
        Parsed info({"--xyz", "-p", "9000", "-q", "plain"});
        return info.isError() && info.getPort() == 9000 ? 0 : 1;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "Bad Option --xyz\nBad Option -q\n");
    EXPECT_EQ(result.out, "");
}

TEST(LoaderInfoTest, OtherComplaintsArePassedOverAndParsingGoesOn) {
    const ChildResult result = runInChild([] {
        Parsed info({"-p", "nonsense", "-n", "worker", "--mode"});
        const bool wentOn = info.getComponentName() == "worker";
        return info.isError() || info.getPort() != 8089 || !wentOn ? 1 : 0;
    });
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
}

TEST(LoaderInfoTest, InitMayBeCalledAgain) {
    const ChildResult result = runInChild([] {
        Parsed info({"--xyz", "-h", "host", "-p", "9000", "--mode", "m", "-n", "comp"});
        info.parse({"-i", "inst"});
        return !info.isError() && info.getHost() == "host" && info.getStartupMode() == "m" &&
                       info.getPort() == 8089 && info.getComponentName() == "korvexd" &&
                       info.getInstallName() == "inst"
                   ? 0
                   : 1;
    });
    EXPECT_EQ(result.status, 0);
}

TEST(LoaderInfoTest, InitSetsTheSwitchesBack) {
    Parsed info({"--debug", "--nodaemon"});
    EXPECT_TRUE(!info.getDebug() && !info.getDaemon() && info.getUseDebugLog());
    const char* const argv[] = {"program", nullptr};
    info.init(1, argv);
    EXPECT_TRUE(info.getDebug() && info.getDaemon() && !info.getUseDebugLog());
}

TEST(LoaderInfoTest, HelpEndsTheProcessAndHidesNoseg) {
    const ChildResult result = runInChild([] {
        Parsed info({"--help"});
        return 7;
    });
    EXPECT_EQ(result.status, 0);
    for (const char* text :
         {"Usage: ", "--nodaemon", "causes the system not to daemonize", "override the config path",
          "override the host name", "the name of the configuration subdir",
          "the component name to start with", "the management port for soap calls", "--debug",
          "start with debug log config", "--mode", "the startup mode",
          "Help options:", "--usage"}) {
        EXPECT_THAT(result.out, HasSubstr(text));
    }
    EXPECT_THAT(result.out, Not(HasSubstr("noseg")));
    EXPECT_THAT(result.out, Not(HasSubstr("dump core")));
}

TEST(LoaderInfoTest, PrintHelpGoesToStandardError) {
    const ChildResult result = runInChild([] {
        LoaderInfo info;
        const char* argv[] = {"prog", nullptr};
        info.init(1, argv);
        info.printHelp();
        return 0;
    });
    EXPECT_EQ(result.out, "");
    EXPECT_THAT(result.err, HasSubstr("the startup mode"));
}

class EnvironmentTest : public testing::Test {
  protected:
    ~EnvironmentTest() override {
        unsetenv("KORVEX_HOME");
        unsetenv("KORVEX_DB");
    }
};

TEST_F(EnvironmentTest, UntidyPathsAreTidiedAndWrittenBack) {
    const char* const all[][2] = {{"/a//b/", "/a/b"}, {"/a/b", "/a/b"}, {"//", "/"},
                                  {"/", "/"},         {"a//", "a"},     {"", ""}};
    for (const auto& t : all) {
        setenv("KORVEX_HOME", t[0], 1);
        setenv("KORVEX_DB", t[0], 1);
        LoaderInfo info;
        info.populateFromEnvironment();
        EXPECT_EQ(info.getKorvexHome(), t[1]);
        EXPECT_EQ(info.getKorvexDb(), t[1]);
        EXPECT_STREQ(getenv("KORVEX_HOME"), t[1]);
        EXPECT_STREQ(getenv("KORVEX_DB"), t[1]);
    }
}

TEST_F(EnvironmentTest, ATidyVariableIsNotWritten) {
    setenv("KORVEX_HOME", "/a/b", 1);
    setenv("KORVEX_DB", "/a/b/", 1);
    LoaderInfo info;
    const CountCalls writes(Call::setenv);
    info.populateFromEnvironment();
    EXPECT_EQ(writes.count(), 1U) << "the untidy one alone";
}

TEST_F(EnvironmentTest, AnUnsetVariableLeavesTheMemberAlone) {
    setenv("KORVEX_HOME", "/a", 1);
    LoaderInfo info;
    info.populateFromEnvironment();
    unsetenv("KORVEX_HOME");
    setenv("KORVEX_DB", "/d", 1);
    info.populateFromEnvironment();
    EXPECT_EQ(info.getKorvexHome(), "/a");
    EXPECT_EQ(info.getKorvexDb(), "/d");
    const char* argv[] = {"prog", nullptr};
    info.init(1, argv);
    EXPECT_EQ(info.getKorvexHome(), "/a") << "init leaves the directories alone";
}

class ValidateTest : public EnvironmentTest {
  protected:
    ValidateTest() {
        for (const char* dir : {"home", "home/etc", "home/etc/myinstall", "db"}) {
            EXPECT_EQ(mkdir(_dir.file(dir).c_str(), 0700), 0);
        }
        writeFile(_dir.file("file"), "");
    }

    // validate() with these directories ("" for none) and arguments.
    int validate(const std::string& home, const std::string& db,
                 const std::vector<const char*>& arguments = {}) {
        setenv("KORVEX_HOME", home.c_str(), 1);
        setenv("KORVEX_DB", db.c_str(), 1);
        Parsed info(arguments);
        info.populateFromEnvironment();
        return info.validate();
    }

    TempDir _dir;
};

TEST_F(ValidateTest, TheFirstFailureCounts) {
    const std::string home = _dir.file("home");
    const std::string db = _dir.file("db");
    const std::string file = _dir.file("file");
    const std::string none = _dir.file("none");
    EXPECT_EQ(validate(home, db), 0);
    EXPECT_EQ(validate("", ""), -1);
    EXPECT_EQ(validate("", "rel", {"-n", "", "-i", ""}), -1) << "whatever else is wrong";
    EXPECT_EQ(validate(home, ""), -2);
    EXPECT_EQ(validate("rel", ""), -2);
    EXPECT_EQ(validate("rel", "rel"), -4);
    EXPECT_EQ(validate(none, "rel"), -5);
    EXPECT_EQ(validate(none, none), -7);
    EXPECT_EQ(validate(home, none), -8);
    EXPECT_EQ(validate(file, none), -8);
    EXPECT_EQ(validate(home, db, {"-c", "gone"}), -9);
    EXPECT_EQ(validate(home, db, {"-i", "gone"}), -9);
    EXPECT_EQ(validate(file, db), -9);
    EXPECT_EQ(validate(home, file), -11);
    writeFile(_dir.file("home/etc/plain"), "");
    EXPECT_EQ(validate(home, db, {"-i", "plain"}), -12);
    EXPECT_EQ(validate(home, db, {"-n", ""}), -15);
    EXPECT_EQ(validate(home, db, {"-n", "", "-i", ""}), -15);
    EXPECT_EQ(validate(home, db, {"-i", ""}), -16);
}

TEST_F(ValidateTest, AHomeThatIsAFileIsFoundWhereItsPathsExist) {
    const std::string file = _dir.file("file");
    const std::string db = _dir.file("db");
    EXPECT_EQ(validate(file, db, {"-c", "/", "-i", "/"}), -9) << "below a file nothing exists";
    EXPECT_EQ(validate(file, db, {"-c", "", "-i", ""}), -10) << "the paths are the home";
}

TEST_F(ValidateTest, AConfigPathThatIsAFileIsToldWithoutAnInstallName) {
    writeFile(_dir.file("home/plain"), "");
    EXPECT_EQ(validate(_dir.file("home"), _dir.file("db"), {"-c", "plain", "-i", ""}), -12);
}

TEST(ErrorMessageTest, EachCodeHasItsText) {
    const char* const texts[] = {
        "The environment variable KORVEX_HOME must not be empty.",
        "The environment variable KORVEX_DB must not be empty.",
        "The common config path must be defined in the config file.",
        "The environment variable KORVEX_HOME must not be a relative path.",
        "The environment variable KORVEX_DB must not be a relative path.",
        "The common config path must not be a relative path.",
        "The environment variable KORVEX_HOME must point to an existing path.",
        "The environment variable KORVEX_DB must point to an existing path.",
        "The common config path must point at an existing path.",
        "The environment variable KORVEX_HOME must point to a directory.",
        "The environment variable KORVEX_DB must point to a directory.",
        "The common config path must point to a directory.",
        ("The environment variable KORVEX_HOME must point to a directory that's writable the "
         "process."),
        "The environment variable KORVEX_DB must point to a directory that's writable the process.",
        "The component name must not be empty.",
        "The install name must not be empty.",
        "The component name was too large for spread."};
    for (int i = 0; i < 17; ++i)
        EXPECT_STREQ(LoaderInfo::getErrorMessage(-1 - i), texts[i]);
    for (const int code : {0, 1, -18, 1000})
        EXPECT_STREQ(LoaderInfo::getErrorMessage(code), "");
}

TEST_F(EnvironmentTest, ACopyLeavesTheDatabaseAndTheModeBehind) {
    setenv("KORVEX_HOME", "/home", 1);
    setenv("KORVEX_DB", "/db", 1);
    Parsed source({"-n", "comp", "-c", "conf", "-i", "inst", "-p", "1", "-h", "host", "--noseg",
                   "--nodaemon", "--debug", "--mode", "m"});
    source.populateFromEnvironment();
    source.setCommonComponentNode(xml::node("name", "content"));
    LoaderInfo copy(source);
    EXPECT_EQ(copy.getKorvexHome(), "/home");
    EXPECT_EQ(copy.getComponentName(), "comp");
    EXPECT_EQ(copy.getInstallConfigPath(), "/home/conf/inst");
    EXPECT_EQ(copy.getPort(), 1);
    EXPECT_EQ(copy.getPid(), source.getPid());
    EXPECT_EQ(copy.getStartupTime(), source.getStartupTime());
    EXPECT_EQ(copy.getHost(), "host");
    EXPECT_STREQ(copy.getCommonComponentNode().get_content(), "content");
    EXPECT_TRUE(copy.getDebug() && !copy.getDaemon() && copy.getUseDebugLog());
    EXPECT_EQ(copy.getKorvexDb(), "");
    EXPECT_EQ(copy.getStartupMode(), "");
    EXPECT_FALSE(copy == source);
    LoaderInfo target;
    setenv("KORVEX_DB", "/other", 1);
    target.populateFromEnvironment();
    target = source;
    EXPECT_EQ(target.getKorvexDb(), "/other") << "left alone";
    const LoaderInfo& self = target;
    target = self;
    EXPECT_EQ(target.getComponentName(), "comp");
    copy.populateFromCommandLine();
    EXPECT_EQ(copy.getStartupMode(), "") << "a copy has no command line";
}

TEST_F(EnvironmentTest, EqualityLooksAtAllButTheNode) {
    Parsed a({});
    LoaderInfo b(a);
    EXPECT_TRUE(a == b);
    b.setCommonComponentNode(xml::node("other"));
    EXPECT_TRUE(a == b);
    const std::vector<std::vector<const char*>> differences = {
        {"-n", "x"}, {"-c", "x"}, {"-i", "x"},    {"-p", "1"},    {"-h", "x"},
        {"--noseg"}, {"--debug"}, {"--nodaemon"}, {"--mode", "x"}};
    for (const auto& arguments : differences) {
        EXPECT_FALSE(a == Parsed(arguments)) << arguments.front();
    }
    setenv("KORVEX_DB", "/db", 1);
    LoaderInfo c(a);
    c.populateFromEnvironment();
    EXPECT_FALSE(a == c);
    unsetenv("KORVEX_DB");
    setenv("KORVEX_HOME", "/home", 1);
    LoaderInfo d(a);
    d.populateFromEnvironment();
    EXPECT_FALSE(a == d);
}

TEST_F(EnvironmentTest, EqualityLooksAtTheProcess) {
    const Parsed parent({});
    const auto result = runInChild([&] {
        const Parsed child({});
        return parent == child ? 1 : 0;
    });
    EXPECT_EQ(result.status, 0);
}

TEST_F(EnvironmentTest, EqualityLooksAtTheStart) {
    const Parsed first({});
    while (time(nullptr) == first.getStartupTime())
        usleep(10000);
    EXPECT_FALSE(first == Parsed({}));
}

TEST(LoaderInfoTest, AConstRecordShowsItsNode) {
    LoaderInfo info;
    info.setCommonComponentNode(xml::node("name", "content"));
    const LoaderInfo& shown = info;
    EXPECT_STREQ(shown.getCommonComponentNode().get_content(), "content");
    EXPECT_EQ(&shown.getCommonComponentNode(), &info.getCommonComponentNode());
}

TEST(LoaderInfoTest, AParserThatCannotBeMadeIsNoMemory) {
    const FailNth fault(Call::poptGetContext, 1, ENOMEM);
    EXPECT_THROW(Parsed({}), std::bad_alloc);
}

TEST(LoaderInfoTest, TheNodeIsStoredAsACopyAndHandedOutItself) {
    LoaderInfo info;
    EXPECT_STREQ(info.getCommonComponentNode().get_name(), "blank");
    xml::node node("name", "content");
    info.setCommonComponentNode(node);
    node.set_name("changed");
    EXPECT_STREQ(info.getCommonComponentNode().get_name(), "name");
    info.getCommonComponentNode().set_name("inside");
    EXPECT_STREQ(info.getCommonComponentNode().get_name(), "inside");
}

ChildResult setUp(const char* home, const std::vector<const char*>& arguments = {}) {
    return runInChild([&] {
        if (home != nullptr) {
            setenv("KORVEX_HOME", home, 1);
        } else {
            unsetenv("KORVEX_HOME");
        }
        std::vector<const char*> argv{"prog"};
        argv.insert(argv.end(), arguments.begin(), arguments.end());
        argv.push_back(nullptr);
        LoaderInfo::common_main_setup(static_cast<int>(argv.size()) - 1, argv.data(), nullptr);
        printf("[%s]\n", getenv("KORVEX_HOME"));
        return 0;
    });
}

TEST(CommonMainSetupTest, WithoutAHomeTheProcessEnds) {
    for (const char* home : {static_cast<const char*>(nullptr), ""}) {
        const ChildResult result = setUp(home);
        EXPECT_EQ(result.status, 255);
        EXPECT_EQ(result.out, "KORVEX_HOME must be set.  Stopping.\n");
        EXPECT_EQ(result.err, "");
    }
}

TEST(CommonMainSetupTest, TheConfigurationPathIsPrintedAndRead) {
    const ChildResult result = setUp("/nowhere//k/");
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out,
              "Using logging configuration at /nowhere/k/etc/log-cmdline.cfg.\n[/nowhere/k]\n");
    EXPECT_EQ(result.err,
              "Couldn't open log file configuration "
              "\"/nowhere/k/etc/log-cmdline.cfg\": No such file or directory\n");
}

TEST(CommonMainSetupTest, OptionsAreNotParsed) {
    const ChildResult result = setUp("/nowhere", {"-c", "other", "--debug", "--unknown", "--help"});
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(result.out, HasSubstr("at /nowhere/etc/log-cmdline.cfg.\n"));
}

TEST(CommonMainSetupTest, LoggingFollowsTheFile) {
    const TempDir home;
    ASSERT_EQ(mkdir(home.file("etc").c_str(), 0700), 0);
    writeFile(home.file("etc/log-cmdline.cfg"),
              "rootCategory=DEBUG,A\nappender.A.fileName=${KORVEX_HOME}/x.log\nfoo\n");
    EXPECT_EQ(setUp(home.path().c_str()).err, "");
    EXPECT_EQ(testsupport::readFile(home.file("x.log")),
              home.file("etc/log-cmdline.cfg") + ":3: Parse error at \"foo\"\n");
}

}  // namespace
