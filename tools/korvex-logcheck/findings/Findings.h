#pragma once

#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "Configuration.h"
#include "Source.h"
#include "Status.h"
#include "findings/Code.h"

// Something to be told about one place of the file. What is told and what is mended cannot differ,
// because a finding carries both.
struct Finding {
    Code code;
    Place place;
    std::string message;      // printable; what it does
    std::string meant;        // what was surely meant there; empty: not known
    std::vector<Edit> edits;  // what mends it; empty: nothing sure does
};

using Findings = std::vector<Finding>;

// What findings are made from: the file's text, and what the library makes of it.
struct Reading {
    const Source& source;
    const Configuration& config;
};

// Who is to write the log files.
struct Writer {
    std::optional<std::string> user;  // none: who runs the tool
};

struct Wanted {
    Pathname home;                // replaces ${KORVEX_HOME}; empty: it stays as written
    std::optional<Writer> paths;  // look whether the files can be written
};

// Everything there is to tell, in the order of the lines. Reads the configuration anew, so what
// was read before is gone. Throws Failure when the user cannot be looked as.
Findings findAll(const Source& source, const Wanted& wanted);

Status statusOf(const Findings& findings);

// What findAll() is made of, a family of slips each; each adds to the findings.
void findInBytes(const Source& source, Findings& to);
void findInKeys(const Reading& reading, Findings& to);
void findInWords(const Reading& reading, Findings& to);
void findInCategories(const Reading& reading, Findings& to);
void findInLevels(const Reading& reading, Findings& to);
void findInAttributes(const Reading& reading, Findings& to);
void findInValues(const Reading& reading, Findings& to);
void findInAppenders(const Reading& reading, Findings& to);
void findInFiles(const Reading& reading, Findings& to);
void findInLimits(const Reading& reading, Findings& to);
void findInPatterns(const Reading& reading, Findings& to);
// Of layouts as a whole, where patterns are told already.
void findInLayouts(const Reading& reading, Findings& to);
void findInPaths(const Reading& reading, const Writer& writer, Findings& to);
// The argument of a %d, for findInPatterns().
void findInDate(const Piece& argument, Findings& to);

inline void tell(Findings& to, Code code, const Place& place, std::string message,
                 std::string meant = {}, std::vector<Edit> edits = {}) {
    to.push_back({code, place, std::move(message), std::move(meant), std::move(edits)});
}

// Where the parts of a line stand that the library took for something.
Piece valueOf(const Source& source, const ConfigStatement& said);
Piece nameOf(const Source& source, const ConfigStatement& said);
Piece attributeOf(const Source& source, const ConfigStatement& said);
Place placeOf(const Source& source, const ConfigStatement& said);
// The first character of a line's content that is no blank.
Place placeOf(const Source& source, unsigned lineno);

// There is no additivity.
void tellAdditivity(Findings& to, const Place& place, const std::string& error);

// Begins the message of a line that the library refuses as the library does.
std::string parseError(const Reading& reading, unsigned lineno);
