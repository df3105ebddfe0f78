#include <sstream>

#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::ElementsAreArray;
using testing::HasSubstr;

const std::string kFolder = KORVEX_SOURCE_DIR "/tools/korvex-records/";

class HelpTest : public RecordsToolTest {
  protected:
    // Without any environment.
    ChildResult bare(const std::vector<std::string>& arguments) const {
        return runInChild([&] {
            clearenv();
            testsupport::execTool(arguments);
            return 127;
        });
    }
    std::vector<std::string> verbs() const {
        std::istringstream lines(help.substr(help.find("\nVerbs:\n") + 8));
        std::vector<std::string> all;
        for (std::string line; std::getline(lines, line) && !line.empty();)
            all.push_back(line.substr(2, line.find(' ', 2) - 2));
        return all;
    }
    std::vector<std::string> options() const {
        std::vector<std::string> all;
        for (std::size_t at = help.find("\nOptions"); (at = help.find(" --", at)) != help.npos;) {
            const std::size_t end = help.find_first_of(" =\n", ++at);
            all.push_back(help.substr(at, end - at));
        }
        return all;
    }

    const std::string help = bare({"--help"}).out;
};

std::string manualPage() {
    std::string page = readFile(kFolder + "korvex-records.1");
    page.erase(std::remove(page.begin(), page.end(), '\\'), page.end());
    return page;
}

TEST_F(HelpTest, ItNamesEachVerbAndOptionAndSaysWhatTheVerbsDo) {
    EXPECT_THAT(verbs(), ElementsAreArray({"list", "get", "put", "remove", "dump", "load", "batch",
                                           "check", "diff", "stats", "salvage", "help"}));
    EXPECT_THAT(options(),
                ElementsAreArray({"--file", "--long", "--null", "--hex", "--input", "--value",
                                  "--print", "--json", "--replace", "--keep", "--dry-run",
                                  "--output", "--key-escaped", "--create", "--wait",
                                  "--any-version", "--verbose", "--version", "--help"}));
    EXPECT_THAT(help, HasSubstr("\n  batch [FILE]            do many puts and removes, or none\n"));
}

TEST_F(HelpTest, ItNeedsNoEnvironment) {
    EXPECT_EQ(bare({"--help"}).status, 0);
    EXPECT_EQ(bare({"--help"}).err, "");
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"-h"}, {"-?"}, {"help"}, {"-h", "nonsense"}}) {
        EXPECT_EQ(bare(arguments).out, help) << arguments[0];
        EXPECT_EQ(bare(arguments).status, 0) << arguments[0];
    }
    EXPECT_EQ(bare({"--version"}).out, "korvex-records 1.0.0\n");
    EXPECT_EQ(bare({"nonsense"}).status, 2);
}

TEST_F(HelpTest, AVerbsHelpHasItsOwnOptions) {
    const std::string expected =
        "Usage: korvex-records [OPTION...] get KEY\n"
        "a key's value\n"
        "\n"
        "Options:\n"
        "  -f, --file=FILE         use this record file\n"
        "  -x, --hex               the value as hex digits\n"
        "      --key-escaped       keys are given as list shows them\n"
        "      --verbose           say which logging configuration is used\n"
        "      --version           show the version\n"
        "  -h, --help              show this text, or a verb's\n";
    EXPECT_EQ(bare({"help", "get"}).out, expected);
    EXPECT_EQ(bare({"get", "-h"}).out, expected);
    EXPECT_EQ(bare({"get", "a", "b", "--help"}).out, expected);
    EXPECT_EQ(bare({"help", "nonsense"}).status, 2);
}

TEST_F(HelpTest, AnOptionThatAVerbDoesNotTakeIsAnError) {
    for (const std::string& verb : verbs()) {
        const std::string own = bare({"help", verb}).out;
        for (const std::string& option : options()) {
            const bool isFlag = help.find(option + "=") == help.npos;
            const ChildResult result = bare({verb, isFlag ? option : option + "=1"});
            const std::string refusal =
                "korvex-records: " + verb + " takes no " + option + "; see " + verb + " --help\n";
            const bool isTaken = own.find(option + (isFlag ? " " : "=")) != own.npos;
            EXPECT_EQ(result.err == refusal, !isTaken) << verb << option << result.err;
            if (!isTaken) {
                EXPECT_EQ(result.status, 2) << verb << option;
            }
        }
    }
    for (const std::vector<std::string>& arguments : std::vector<std::vector<std::string>>{
             {"get", "-p", "a"}, {"list", "-x"}, {"dump", "--replace"}, {"put", "-l", "a", "1"}}) {
        EXPECT_EQ(bare(arguments).status, 2) << arguments[0];
        EXPECT_THAT(bare(arguments).err, HasSubstr(" takes no --")) << arguments[0];
    }
}

TEST_F(HelpTest, WhatWasMeantIsTold) {
    const std::pair<const char*, const char*> meant[] = {
        {"delete", "remove"}, {"set", "put"},        {"ls", "list"},      {"cat", "get"},
        {"lsit", "list"},     {"gte", "get"},        {"remov", "remove"}, {"dmup", "dump"},
        {"chekc", "check"},   {"slavage", "salvage"}};
    for (const auto& [typed, verb] : meant) {
        EXPECT_EQ(bare({typed}).err, std::string("korvex-records: ") + typed +
                                         ": unknown verb; did you mean " + verb + "?\n");
    }
    EXPECT_EQ(bare({"xyzzy"}).err, "korvex-records: xyzzy: unknown verb; see --help\n");
    EXPECT_EQ(bare({"help", "delete"}).err,
              "korvex-records: delete: unknown verb; did you mean remove?\n");
    EXPECT_EQ(bare({"help", "xyzzy"}).err, "korvex-records: xyzzy: unknown verb; see --help\n");
    EXPECT_EQ(bare({"--hepl"}).err,
              "korvex-records: --hepl: unknown option; did you mean --help?\n");
    EXPECT_EQ(bare({"--nonsense"}).err, "korvex-records: --nonsense: unknown option\n");
}

TEST_F(HelpTest, TheManualPageTellsEachVerbAndOption) {
    const std::string page = manualPage();
    for (const std::string& verb : verbs()) {
        const testing::Matcher<std::string> isHead =
            testing::AnyOf(HasSubstr("\n.BR " + verb + " \""), HasSubstr("\n.BI " + verb + " \""),
                           HasSubstr("\n.BI " + verb + " FILE"), HasSubstr("\n.B " + verb + "\n"));
        EXPECT_THAT(page, isHead) << verb;
    }
    for (const std::string& option : options())
        EXPECT_THAT(page.substr(page.find(".SH OPTIONS")), HasSubstr(option)) << option;
}

TEST_F(HelpTest, BothShellsCompleteEachVerbAndOption) {
    const std::string bash = readFile(kFolder + "completion/korvex-records.bash");
    const std::string zsh = readFile(kFolder + "completion/_korvex-records");
    for (const std::string& verb : verbs()) {
        EXPECT_THAT(bash, testing::ContainsRegex("[' ]" + verb + "[' \n]")) << verb;
        EXPECT_THAT(zsh, HasSubstr("\n        '" + verb + ":")) << verb;
    }
    const std::size_t words = bash.find("compgen -W '--");
    for (const std::string& option : options()) {
        EXPECT_THAT(bash.substr(words, bash.find("' --", words) - words), HasSubstr(option))
            << option;
        EXPECT_THAT(zsh,
                    testing::AnyOf(HasSubstr(option + "=}'["), HasSubstr(option + "}'["),
                                   HasSubstr("'" + option + "["), HasSubstr("'" + option + "=[")))
            << option;
    }
}

}  // namespace
