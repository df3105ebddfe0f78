#include <algorithm>
#include <cstring>

#include "Text.h"
#include "findings/Attributes.h"
#include "findings/Findings.h"
#include "findings/Levels.h"
#include "findings/MeantAppender.h"

namespace {

std::string called(const Appender& appender) {
    return "Appender " + quoted(appender.name);
}

// The lines "appender.NAME=..." that were understood.
std::vector<unsigned> declarationsOf(const Configuration& config, const Appender& appender) {
    std::vector<unsigned> lines;
    for (const unsigned lineno : appender.declarations) {
        if (!config.isRefused(lineno)) lines.push_back(lineno);
    }
    return lines;
}

void checkDeclared(const Reading& reading, const Appender& appender, Findings& to) {
    const std::vector<unsigned> lines = declarationsOf(reading.config, appender);
    for (std::size_t i = 1; i < lines.size(); ++i) {
        tell(to, Code::APPENDER_TWICE, placeOf(reading.source, lines[i]),
             called(appender) + " has been declared before, on line " +
                 std::to_string(lines.front()) + ": it is one appender, with what both say of it");
    }
}

// Whether it was surely to have a file: a class that is named, though it is not read, says so, and
// limits do.
bool isMeantForFile(const Reading& reading, const Appender& appender) {
    for (const unsigned lineno : declarationsOf(reading.config, appender)) {
        const std::string& line = reading.source.line(lineno).text;
        if (lowered(line.substr(line.find('='))).find("file") != line.npos) return true;
    }
    return isSpokenOf(appender, "maxFileSize") || isSpokenOf(appender, "maxBackupIndex");
}

void checkFile(const Reading& reading, const Appender& appender, Findings& to) {
    const bool told = isMeantToBeSet(reading.config, reading.source, appender, "fileName") ||
                      !meantAppender(reading.config, appender).empty();
    if (told) return;
    for (const std::string_view complaint : appender.complaints) {
        if (complaint.find("has no filename") != 0) continue;
        const bool file = isMeantForFile(reading, appender);
        tell(to, file ? Code::APPENDER_NO_FILE : Code::APPENDER_STDERR,
             placeOf(reading.source, appender.lineno),
             called(appender) + ' ' + std::string(complaint) +
                 (file ? "" : "; rootAppender is there without a word at each start"));
    }
}

// Whether a line that is refused was surely to use it. That line is told, so this is not.
bool isMeantToBeUsed(const Reading& reading, const Appender& appender, const Findings& told) {
    for (const auto& [lineno, text] : reading.config.parseErrors) {
        const std::string& line = reading.source.line(lineno).text;
        const std::size_t sign = line.find_first_of("=:");
        if (line.find("appender.") < std::min(sign, line.size())) continue;
        std::string value = sign == line.npos ? line : line.substr(sign + 1);
        // What people put between words where a comma belongs.
        std::replace_if(
            value.begin(), value.end(), [](char c) { return std::strchr(";|&+/", c) != nullptr; },
            ' ');
        const std::vector<std::string> words = wordsOf(value);
        if (std::count(words.begin(), words.end(), appender.name) > 0) return true;
    }
    return std::any_of(told.begin(), told.end(), [&](const Finding& finding) {
        const bool word = finding.code == Code::WORD_UNKNOWN || finding.code == Code::WORD_HASH;
        return word && finding.meant == appender.name;
    });
}

void checkUse(const Reading& reading, const Appender& appender, Findings& to) {
    const Place place = placeOf(reading.source, appender.lineno);
    if (isLevel(appender.name)) {
        return tell(to, Code::APPENDER_LEVEL_NAME, place,
                    called(appender) + " is spelt like a level: no category can name it");
    }
    if (reading.config.users(*appender.made).empty() && !isMeantToBeUsed(reading, appender, to)) {
        tell(to, Code::APPENDER_UNUSED, place, called(appender) + " is used by nobody",
             meantAppender(reading.config, appender));
    }
}

void checkRootAppender(const Reading& reading, Findings& to) {
    for (const ConfigStatement& said : reading.config.rootAppender.attributes) {
        if (!said.accepted || said.attribute.find("layout") == 0) continue;
        tell(to, Code::APPENDER_ROOT, attributeOf(reading.source, said).place(),
             said.attribute + " of \"rootAppender\" has no effect: it stays on standard error");
    }
}

// Whether it is there only by attributes that are refused, and so told.
bool isOnlyRefused(const Appender& appender) {
    return appender.declarations.empty() &&
           std::none_of(appender.attributes.begin(), appender.attributes.end(),
                        [](const ConfigStatement& said) { return said.accepted; });
}

}  // namespace

void findInAppenders(const Reading& reading, Findings& to) {
    for (const Appender& appender : reading.config.appenders) {
        if (isOnlyRefused(appender)) continue;
        checkDeclared(reading, appender, to);
        checkFile(reading, appender, to);
        checkUse(reading, appender, to);
    }
    checkRootAppender(reading, to);
}
