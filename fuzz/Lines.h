#pragma once

#include <cstdio>
#include <string>

#include "Check.h"
#include "Status.h"
#include "file/Input.h"

// Calls with the text's lines.
template <class Parse>
void parseText(std::string text, Parse parse) {
    std::FILE* const file = fmemopen(text.data(), text.size(), "r");
    check(file != nullptr, "fmemopen");
    LineInput in(file);
    parse(in);
}

// A bad input is wrong usage, and the line is told.
inline void checkLineTold(const Failure& failure, const std::string& what) {
    check(failure.status() == USAGE, "a bad input is wrong usage");
    const std::string start = what + ", line ";
    check(std::string(failure.what()).compare(0, start.size(), start) == 0, "the line is told");
}
