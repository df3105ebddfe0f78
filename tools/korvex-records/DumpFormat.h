#pragma once

#include <istream>
#include <map>
#include <string>
#include <string_view>

// The dump: a header of NAME=VALUE lines from "VERSION=3" to "HEADER=END"; then for each record its
// key and its value, a line each behind one blank, as hex digits (format=bytevalue) or as printable
// text with backslash escapes (format=print); and "DATA=END".

using Records = std::map<std::string, std::string>;

std::string dumpHeader(bool print);
std::string dumpLine(std::string_view bytes, bool print);
std::string dumpTrailer();

// All of a dump; of two records with one key the later one. Throws Failure USAGE, naming the line,
// for anything that is no whole dump, and IO_ERROR when reading fails.
Records parseDump(std::istream& in);
