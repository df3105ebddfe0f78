#pragma once

#include <string>
#include <vector>

namespace testsupport {

// In a child: becomes korvex-records, or the program at the path, through the emulator that
// KORVEX_EMULATOR names where the tests are for another machine. Return only when that failed.
void execTool(const std::vector<std::string>& arguments);
void execProgram(const std::string& path, const std::vector<std::string>& arguments);

// Whether the tests run in an emulator, which has its limits: it knows no ptrace, for one.
bool isEmulated();

}  // namespace testsupport
