#include <algorithm>
#include <set>

#include "Text.h"
#include "findings/Findings.h"
#include "findings/KeyText.h"
#include "findings/NearMiss.h"

namespace {

const char* const kLines =
    "lines are rootCategory=..., category.NAME=..., appender.NAME=... and "
    "appender.NAME.ATTRIBUTE=...";

// The lines whose key was understood.
std::set<unsigned> understoodLines(const Configuration& config) {
    std::set<unsigned> lines;
    for (const ConfigStatement* const said : config.appliedValues())
        lines.insert(said->lineno);
    for (const Appender* const appender : config.everyAppender()) {
        for (const ConfigStatement& said : appender->attributes)
            lines.insert(said.lineno);
    }
    return lines;
}

std::string reasonOf(Code slip) {
    if (slip == Code::KEY_PREFIX) return "the prefix of a key is \"log4cpp.\", or there is none";
    if (slip == Code::KEY_CASE) return "upper and lower case differ";
    if (slip == Code::KEY_COLON) return "a key ends with \"=\"";
    return "that is a key of other libraries";
}

void tellMended(const Reading& reading, const SourceLine& line, const MendedKey& mended,
                Findings& to) {
    const Piece key(line, mended.from, mended.to);
    std::string meant = mended.key;
    std::vector<Edit> edits;
    if (key.text() != mended.key) edits = key.replacedBy(mended.key);
    if (mended.colon != std::string::npos) {
        const Piece colon(line, mended.colon, mended.colon + 1);
        for (const Edit& edit : colon.replacedBy("="))
            edits.push_back(edit);
        meant += '=';
    }
    tell(to, mended.slip, key.place(), parseError(reading, line.lineno) + reasonOf(mended.slip),
         meant, std::move(edits));
}

bool looksLikeComment(std::string_view text) {
    for (const std::string_view start : {"//", "/*", ";", "!", "--", "REM ", "rem "}) {
        if (beginsWith(text, start)) return true;
    }
    return false;
}

// Whether the line before it, in the file, ends in a backslash.
bool isContinued(const Source& source, const SourceLine& line) {
    const std::string_view before = std::string_view(source.bytes()).substr(0, line.begin);
    const std::size_t last = before.find_last_not_of("\r\n");
    return last != before.npos && before[last] == '\\';
}

// Why the library understands nothing.
std::string reasonFor(std::string_view text, const std::string& word) {
    const bool named = beginsWith(text, "category.") || beginsWith(text, "appender.");
    if (looksLikeComment(text)) return "a comment begins with \"#\"";
    if (word == "rootCategory" || (named && text.find('=') == text.npos)) {
        return std::string("there is no \"=\" where one belongs; ") + kLines;
    }
    if (beginsWith(text, "appender.=") || beginsWith(text, "appender. ")) {
        return std::string("the appender has no name; ") + kLines;
    }
    return kLines;
}

void explain(const Reading& reading, const SourceLine& line, Findings& to) {
    const std::string error = parseError(reading, line.lineno);
    const Place place = placeOf(reading.source, line.lineno);
    if (const auto mended = mendedKey(line.text)) return tellMended(reading, line, *mended, to);
    std::string_view text = line.text;
    text.remove_prefix(std::min(text.find_first_not_of(" \t"), text.size()));
    if (beginsWith(text, "log4cpp.")) text.remove_prefix(8);
    const std::string word(text.substr(0, text.find_first_of(".= \t")));
    if (lowered(word) == "additivity") return tellAdditivity(to, place, error);
    if (isContinued(reading.source, line)) {
        return tell(to, Code::KEY_UNKNOWN, place,
                    error + "a backslash does not carry a line on to the next one");
    }
    tell(to, Code::KEY_UNKNOWN, place, error + reasonFor(text, word),
         nearestTo(word, {"rootCategory", "category", "appender"}));
}

}  // namespace

void findInKeys(const Reading& reading, Findings& to) {
    const std::set<unsigned> understood = understoodLines(reading.config);
    for (const auto& [lineno, text] : reading.config.parseErrors) {
        if (understood.count(lineno) == 0) explain(reading, reading.source.line(lineno), to);
    }
}
