#pragma once

#include <string>
#include <string_view>

#include "file/Input.h"
#include "text/DumpedRecord.h"

// A dump as JSON: one object a line, {"key":"...","value":"..."}. Bytes that are not UTF-8 are in
// base 64, and the name says so: "key_base64", "value_base64".

// Appends a record's line.
void appendJsonLine(std::string& out, std::string_view key, std::string_view value);
// The last line of what was dumped of a damaged file; parseJson() refuses it.
std::string jsonDamage(const std::string& damage);

// Hands on each record. Throws Failure USAGE, naming the line, for anything else, and IO_ERROR when
// reading fails.
void parseJson(LineInput& in, const DumpedRecordTaker& take);
