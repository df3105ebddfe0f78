#include <sstream>

#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::ElementsAreArray;
using testing::HasSubstr;
using testing::Not;

const std::string kFolder = KORVEX_SOURCE_DIR "/tools/korvex-records/";

class HelpTest : public RecordsToolTest {
  protected:
    const std::string help = run({"--help"}).out;

    std::vector<std::string> verbs() const {
        const std::size_t start = help.find("[OPTION...] ") + 12;
        std::istringstream list(help.substr(start, help.find(" [ARG", start) - start));
        std::vector<std::string> all;
        for (std::string verb; std::getline(list, verb, '|');)
            all.push_back(verb);
        return all;
    }
    std::vector<std::string> options() const {
        std::vector<std::string> all;
        for (std::size_t at = 0; (at = help.find("--", at)) != help.npos;) {
            const std::size_t end = help.find_first_of(" =\n", at);
            all.push_back(help.substr(at, end - at));
            at = end;
        }
        return all;
    }
};

std::string manualPage() {
    std::string page = readFile(kFolder + "korvex-records.1");
    page.erase(std::remove(page.begin(), page.end(), '\\'), page.end());
    return page;
}

TEST_F(HelpTest, ItNamesEachVerbAndOption) {
    EXPECT_THAT(verbs(), ElementsAreArray({"list", "get", "put", "remove", "dump", "load", "check",
                                           "diff", "stats"}));
    EXPECT_THAT(options(),
                ElementsAreArray({"--file", "--long", "--null", "--hex", "--print", "--input",
                                  "--create", "--force", "--version", "--help"}));
}

TEST_F(HelpTest, TheVerbsItNamesAreKnown) {
    for (const std::string& verb : verbs())
        EXPECT_THAT(run({verb, "a", "b", "c"}).err, Not(HasSubstr("unknown verb"))) << verb;
    EXPECT_THAT(run({"unlist"}).err, HasSubstr("unlist: unknown verb"));
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
    EXPECT_THAT(bash, HasSubstr("'list get put remove dump load check diff stats'"));
    for (const std::string& verb : verbs())
        EXPECT_THAT(zsh, HasSubstr("\n        '" + verb + ":")) << verb;
    const std::size_t words = bash.find("compgen -W '--");
    for (const std::string& option : options()) {
        EXPECT_THAT(bash.substr(words, bash.find("' --", words) - words), HasSubstr(option))
            << option;
        EXPECT_THAT(zsh, testing::AnyOf(HasSubstr(option + "=}'["), HasSubstr(option + "}'["),
                                        HasSubstr("'" + option + "[")))
            << option;
    }
}

}  // namespace
