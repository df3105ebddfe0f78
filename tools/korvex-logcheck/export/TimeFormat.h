#pragma once

#include <string>

#include "export/LineShape.h"

// The time of the field as each engine's date reader is told of it. Each throws Inexpressible.
std::string strptimeFormat(const LineField& time, const std::string& milliseconds);
std::string goFormat(const LineField& time);
std::string javaFormat(const LineField& time);
