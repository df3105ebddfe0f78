#include "findings/Findings.h"

#include <algorithm>
#include <tuple>

#include "Text.h"

namespace {

bool standsBefore(const Finding& a, const Finding& b) {
    return std::tie(a.place.line, a.place.column) < std::tie(b.place.line, b.place.column);
}

std::size_t startOfName(const SourceLine& line, const ConfigStatement& said) {
    std::size_t key = std::min(line.text.find_first_not_of(" \t"), line.text.size());
    constexpr std::string_view prefix = "log4cpp.";
    if (line.text.compare(key, prefix.size(), prefix) == 0) key += prefix.size();
    if (said.kind == ConfigStatement::ROOT) return key;
    return line.text.find('.', key) + 1;
}

}  // namespace

Findings findAll(const Source& source, const Wanted& wanted) {
    Findings all;
    findInBytes(source, all);
    const bool unreadable = std::any_of(all.begin(), all.end(), [](const Finding& finding) {
        return finding.code == Code::BYTES_UTF16;
    });
    if (unreadable) return all;
    const Configuration config = Configuration::read(source.text(), wanted.home);
    const Reading reading{source, config};
    for (const auto find :
         {findInKeys, findInWords, findInCategories, findInLevels, findInAttributes, findInValues,
          findInAppenders, findInFiles, findInLimits, findInPatterns, findInLayouts}) {
        find(reading, all);
    }
    if (wanted.paths) findInPaths(reading, *wanted.paths, all);
    std::stable_sort(all.begin(), all.end(), standsBefore);
    return all;
}

Status statusOf(const Findings& findings) {
    Status status = CLEAN;
    for (const Finding& finding : findings) {
        const Severity severity = rowOf(finding.code).severity;
        if (severity == Severity::ERROR) status = ERRORS;
        if (severity == Severity::WARNING) status = std::max(status, WARNINGS);
    }
    return status;
}

Piece valueOf(const Source& source, const ConfigStatement& said) {
    return Piece::tail(source.line(said.lineno), said.value.size());
}

Piece nameOf(const Source& source, const ConfigStatement& said) {
    const SourceLine& line = source.line(said.lineno);
    const std::size_t from = startOfName(line, said);
    return {line, from, from + said.name.size()};
}

Piece attributeOf(const Source& source, const ConfigStatement& said) {
    const Piece name = nameOf(source, said);
    return {name.line(), name.to() + 1, name.to() + 1 + said.attribute.size()};
}

Place placeOf(const Source& source, const ConfigStatement& said) {
    return placeOf(source, said.lineno);
}

Place placeOf(const Source& source, unsigned lineno) {
    const SourceLine& line = source.line(lineno);
    const std::size_t first = std::min(line.text.find_first_not_of(" \t"), line.text.size());
    return Piece(line, first, line.text.size()).place();
}

std::string parseError(const Reading& reading, unsigned lineno) {
    return "Parse error at " + quoted(shortened(reading.config.parseErrors.at(lineno))) + ": ";
}

void tellAdditivity(Findings& to, const Place& place, const std::string& error) {
    tell(to, Code::KEY_ADDITIVITY, place,
         error +
             "there is no additivity: names are flat, and a category that names an appender writes "
             "to no other");
}
