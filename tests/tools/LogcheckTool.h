#pragma once

#include <gmock/gmock.h>

#include <cstdlib>
#include <sstream>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/TempDir.h"
#include "tools/ExecTool.h"

namespace testsupport {

inline std::vector<std::string> outputLines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

// korvex-logcheck as a user runs it, on a configuration of the test's own.
class LogcheckToolTest : public testing::Test {
  protected:
    void configure(const std::string& text) const { writeFile(file, text); }
    // KORVEX_HOME is not set.
    ChildResult run(const std::vector<std::string>& arguments) const {
        return runInChild([&] {
            unsetenv("KORVEX_HOME");
            execLogcheck(arguments);
            return 127;
        });
    }
    ChildResult check(const std::string& text, std::vector<std::string> arguments = {}) const {
        configure(text);
        arguments.insert(arguments.begin(), file);
        return run(arguments);
    }
    // What is told of the configuration, as "LINE:COLUMN: warning: ... [CODE]". The status goes
    // with it.
    std::vector<std::string> findings(const std::string& text,
                                      std::vector<std::string> arguments = {}) const {
        arguments.emplace_back("-q");
        const ChildResult result = check(text, arguments);
        std::vector<std::string> all;
        int expected = 0;
        for (const std::string& line : outputLines(result.out)) {
            EXPECT_EQ(line.compare(0, file.size() + 1, file + ':'), 0) << line;
            all.push_back(line.substr(file.size() + 1));
            if (all.back().find(": error: ") != std::string::npos) expected = 2;
            if (all.back().find(": warning: ") != std::string::npos && expected == 0) expected = 1;
        }
        EXPECT_EQ(result.status, expected) << result.err;
        EXPECT_EQ(result.err, "");
        return all;
    }
    // The codes alone, in the order of the places.
    std::vector<std::string> codes(const std::string& text) const {
        std::vector<std::string> all;
        for (const std::string& line : findings(text)) {
            const std::size_t from = line.rfind('[') + 1;
            all.push_back(line.substr(from, line.size() - from - 1));
        }
        return all;
    }
    // What --fix makes of it.
    std::string fixed(const std::string& text) const { return check(text, {"--fix"}).out; }

    const TempDir dir;
    const std::string file = dir.file("log.cfg");
    // A whole appender, used by the root; and one that only lacks its pattern.
    const std::string good = "rootCategory=INFO,A\nappender.A.fileName=/a.log\n";
    const std::string pattern = good + "appender.A.layout.ConversionPattern=";
};

}  // namespace testsupport
