#pragma once

#include <string>
#include <string_view>

#include "file/Input.h"
#include "text/DumpedRecord.h"

// The dump: a header of NAME=VALUE lines from "VERSION=3" to "HEADER=END"; then for each record its
// key and its value, a line each behind one blank, as hex digits (format=bytevalue) or as printable
// text with backslash escapes (format=print); and "DATA=END".

std::string dumpHeader(bool print);
// Appends a key's or a value's line.
void appendDumpLine(std::string& out, std::string_view bytes, bool print);
std::string dumpTrailer();

// Hands on each record of a dump that is one database from the first line to the last. Throws
// Failure USAGE, naming the line, for anything else, and IO_ERROR when reading fails.
void parseDump(LineInput& in, const DumpedRecordTaker& take);
