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

    const TempDir dir;
    const std::string file = dir.file("log.cfg");
};

inline std::vector<std::string> outputLines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

}  // namespace testsupport
