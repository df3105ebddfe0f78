#define PCRE2_CODE_UNIT_WIDTH 8
#include <gmock/gmock.h>
#include <korvex/util/Thread.h>
#include <pcre2.h>

#include <algorithm>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

#include "engines/Shapes.h"
#include "support/Child.h"
#include "support/TempDir.h"
#include "tools/ExecTool.h"

namespace {

using testsupport::Logged;
using testsupport::readFile;
using testsupport::TempDir;
using testsupport::writeFile;

// An expression with named groups.
class Pcre {
  public:
    explicit Pcre(const std::string& expression) {
        int error = 0;
        PCRE2_SIZE offset = 0;
        _code.reset(
            pcre2_compile(bytes(expression), expression.size(), 0, &error, &offset, nullptr));
        EXPECT_TRUE(_code) << expression << ": error " << error << " at " << offset;
        _data.reset(pcre2_match_data_create_from_pattern(_code.get(), nullptr));
    }
    // Matches from there on and moves behind the match.
    bool next(const std::string& text, std::size_t& from) {
        _text = &text;
        if (pcre2_match(_code.get(), bytes(text), text.size(), from, PCRE2_NOTEMPTY, _data.get(),
                        nullptr) <= 0) {
            return false;
        }
        const PCRE2_SIZE* const ends = pcre2_get_ovector_pointer(_data.get());
        EXPECT_EQ(ends[0], from) << "something stands between two messages";
        from = ends[1];
        return true;
    }
    // The group's text; "-" when there is no such group.
    std::string group(const char* name) const {
        const int number =
            pcre2_substring_number_from_name(_code.get(), reinterpret_cast<PCRE2_SPTR>(name));
        if (number < 0) return "-";
        const PCRE2_SIZE* const ends =
            pcre2_get_ovector_pointer(_data.get()) + std::size_t{2} * static_cast<unsigned>(number);
        return _text->substr(ends[0], ends[1] - ends[0]);
    }

  private:
    static PCRE2_SPTR bytes(const std::string& text) {
        return reinterpret_cast<PCRE2_SPTR>(text.data());
    }
    struct Free {
        void operator()(pcre2_code* code) const { pcre2_code_free(code); }
        void operator()(pcre2_match_data* data) const { pcre2_match_data_free(data); }
    };
    std::unique_ptr<pcre2_code, Free> _code;
    std::unique_ptr<pcre2_match_data, Free> _data;
    const std::string* _text = nullptr;
};

class PcreExportTest : public testing::Test {
  protected:
    void configure(const std::string& layout) const {
        writeFile(_dir.file("log.cfg"),
                  "rootCategory=DEBUG,LOG\nappender.LOG.fileName=" + _dir.file("app.log") +
                      "\nappender.LOG.maxFileSize=200000\n"
                      "appender.LOG.maxBackupIndex=9\n"
                      "appender.LOG.layout.ConversionPattern=" +
                      layout + "\n");
    }
    // The expression that korvex-logcheck gives for the configuration.
    std::string expression() const {
        const testsupport::ChildResult result = testsupport::runInChild([&] {
            testsupport::execLogcheck({"--export", "pcre", _dir.file("log.cfg")});
            return 127;
        });
        EXPECT_EQ(result.status, 0) << result.err;
        const std::string name = "# LOG: " + _dir.file("app.log") + "\n";
        const std::size_t begin = result.out.find(name);
        return result.out.substr(begin + name.size(), result.out.size() - begin - name.size() - 1);
    }
    // All that was logged, oldest first.
    std::string logs() const {
        std::string all;
        for (int n = 9; n > 0; --n)
            all += readFile(_dir.file("app.log." + std::to_string(n)));
        return all + readFile(_dir.file("app.log"));
    }

    const TempDir _dir;
};

std::string levelName(LogLevel level, const std::string& layout) {
    unsigned long length = 0;
    const std::string name = loglevel2str(&length, level);
    return layout.find("%.2p") == layout.npos ? name : name.substr(0, 2);
}

// Whether the layout cuts that conversion to two bytes.
bool cuts(const std::string& layout, char letter) {
    return layout.find(std::string(".2") + letter) != layout.npos;
}

// The group's text is what was logged, where the layout has such a group.
void expectGroup(const Pcre& found, const char* name, const std::string& logged) {
    const std::string group = found.group(name);
    if (group != "-") {
        EXPECT_EQ(group, logged) << name;
    }
}

// Without the zeros that fill it up.
std::string number(const std::string& text) {
    const std::size_t first = text.find_first_not_of('0');
    return first == text.npos ? text.substr(0, 1) : text.substr(first);
}

void expectFound(const Pcre& found, const Logged& logged, const std::string& layout) {
    EXPECT_EQ(found.group("message"), logged.message);
    EXPECT_EQ(found.group("level"), levelName(logged.level, layout));
    EXPECT_EQ(found.group("time"), logged.time);
    expectGroup(found, "channel", cuts(layout, 'c') ? logged.channel.substr(0, 2) : logged.channel);
    expectGroup(found, "thread", logged.thread);
    EXPECT_EQ(found.group("uptime_s") == "-", layout.find('R') == layout.npos);
    expectGroup(found, "uptime_s", logged.uptimeS);
    EXPECT_EQ(found.group("uptime_ms") == "-", layout.find("%08r") == layout.npos);
    if (found.group("uptime_ms") != "-") {
        EXPECT_EQ(number(found.group("uptime_ms")), logged.uptimeMs);
    }
    EXPECT_EQ(found.group("cpu_ticks") == "-", layout.find("%u") == layout.npos);
}

std::vector<std::string> layouts() {
    std::vector<std::string> all;
    std::ifstream file(KORVEX_SOURCE_DIR "/tests/engines/layouts.txt");
    for (std::string line; std::getline(file, line);)
        all.push_back(line);
    return all;
}

// Each in a process of its own, whose logging it sets up.
TEST_F(PcreExportTest, EveryMessageOfEveryLayoutComesBackToTheByte) {
    ASSERT_GE(layouts().size(), 8U);
    for (const std::string& layout : layouts()) {
        SCOPED_TRACE(layout);
        configure(layout);
        Pcre pcre(expression());
        const testsupport::ChildResult child = testsupport::runInChild([&] {
            const Thread mainThread;
            Logger::initialize(Pathname(_dir.file("log.cfg")), Pathname());
            const std::vector<Logged> logged =
                testsupport::logAll(*LogAppender::find("LOG", false), 3000);
            const std::string text = logs();
            std::size_t from = 0;
            for (const Logged& one : logged) {
                if (!pcre.next(text, from)) {
                    ADD_FAILURE() << "no match at " << text.substr(from, 100);
                    break;
                }
                expectFound(pcre, one, layout);
                if (testing::Test::HasFailure()) break;
            }
            EXPECT_EQ(from, text.size());
            return testing::Test::HasFailure() ? 1 : 0;
        });
        EXPECT_EQ(child.status, 0) << child.out;
        for (const std::string& name : _dir.names())
            std::remove(_dir.file(name).c_str());
    }
}

TEST_F(PcreExportTest, AMessageOfManyLinesIsOneMatch) {
    configure("%d %c: %m%n");
    Pcre pcre(expression());
    std::string message = "first";
    for (int n = 0; n < 5000; ++n)
        message += "\nline " + std::to_string(n);
    const std::string text = "2007-03-05 14:03:09,007 net: " + message + "\n";
    std::size_t from = 0;
    ASSERT_TRUE(pcre.next(text, from));
    EXPECT_EQ(pcre.group("message"), message);
    EXPECT_EQ(pcre.group("time"), "2007-03-05 14:03:09,007");
    EXPECT_EQ(from, text.size());
}

}  // namespace
