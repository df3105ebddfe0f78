#pragma once

#include <string>
#include <vector>

namespace testsupport {

// In a child: becomes korvex-records, through the emulator that KORVEX_EMULATOR names where the
// tests are for another machine. Returns only when that failed.
void execTool(const std::vector<std::string>& arguments);

// The same with korvex-logcheck.
void execLogcheck(const std::vector<std::string>& arguments);

// Whether the tests run in an emulator, which has its limits: it knows no ptrace, for one.
bool isEmulated();

}  // namespace testsupport
