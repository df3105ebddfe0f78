#pragma once

#include <string>
#include <vector>

namespace testsupport {

// In a child: becomes the program at the path, through the emulator that KORVEX_EMULATOR names
// where the tests are for another machine. Returns only when that failed.
void execProgram(const std::string& path, const std::vector<std::string>& arguments);

// The same with korvex-records.
void execTool(const std::vector<std::string>& arguments);

// The same with korvex-logcheck.
void execLogcheck(const std::vector<std::string>& arguments);

// Whether the tests run in an emulator, which has its limits: it knows no ptrace, for one.
bool isEmulated();

}  // namespace testsupport
