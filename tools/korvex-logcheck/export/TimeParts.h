#pragma once

#include <string>
#include <vector>

#include "export/LineShape.h"
#include "util/Logger/LayoutPieces.h"

// The parts of a date conversion, cut and padded as it says. Throws Doubt for what cannot be read
// back.
std::vector<TimePart> timePartsOf(const LayoutPiece& piece);

// What the parts lack to be an instant: "the year", "the time of day"; empty: nothing.
std::string missingIn(const std::vector<TimePart>& parts);

// Whether the text of the parts may end in a number of any length.
bool endsInFreeNumber(const std::vector<TimePart>& parts);

// The words that %a, %A, %b, %B and %p print in the C locale; empty for other letters.
std::vector<std::string> wordsOfLetter(char letter);
