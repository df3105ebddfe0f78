#include "FindingsReport.h"

#include <algorithm>

#include "Output.h"
#include "Text.h"
#include "support/StandardOutput.h"

namespace {

std::string placed(const std::string& file, const Finding& finding) {
    return printable(file) + ':' + std::to_string(finding.place.line) + ':' +
           std::to_string(finding.place.column) + ": ";
}

std::string told(const Finding& finding) {
    const std::string meant =
        finding.meant.empty() ? "" : "; did you mean " + quoted(finding.meant) + '?';
    return finding.message + meant + " [" + std::string(rowOf(finding.code).name) + "]\n";
}

Ink inkOf(Severity severity) {
    if (severity == Severity::ERROR) return Ink::ERROR;
    return severity == Severity::WARNING ? Ink::WARNING : Ink::QUIET;
}

std::size_t countOf(Severity severity, const Findings& findings) {
    return static_cast<std::size_t>(std::count_if(
        findings.begin(), findings.end(),
        [=](const Finding& finding) { return rowOf(finding.code).severity == severity; }));
}

std::string counted(std::size_t count, const std::string& what) {
    return std::to_string(count) + ' ' + what + (count == 1 ? "" : "s");
}

// The text is printable, so only these two characters mean something in JSON.
std::string jsonText(std::string_view text) {
    std::string all = "\"";
    for (const char c : printable(text)) {
        if (c == '"' || c == '\\') all += '\\';
        all += c;
    }
    return all + '"';
}

}  // namespace

void writeFindings(const std::string& file, const Findings& findings) {
    for (const Finding& finding : findings) {
        const Severity severity = rowOf(finding.code).severity;
        write(placed(file, finding));
        write(std::string(nameOf(severity)) + ": ", inkOf(severity));
        write(told(finding));
    }
}

std::string findingsText(const std::string& file, const Findings& findings) {
    std::string all;
    for (const Finding& finding : findings) {
        all += placed(file, finding);
        all.append(nameOf(rowOf(finding.code).severity)).append(": ") += told(finding);
    }
    return all;
}

void writeSummary(const Findings& findings) {
    const std::size_t errors = countOf(Severity::ERROR, findings);
    const std::size_t warnings = countOf(Severity::WARNING, findings);
    const std::size_t notes = countOf(Severity::NOTE, findings);
    write(errors + warnings == 0 ? "no errors, no warnings"
                                 : counted(errors, "error") + ", " + counted(warnings, "warning"));
    if (notes > 0) write(", " + counted(notes, "note"));
    write("\n");
}

void writeJson(const std::string& file, const Findings& findings) {
    for (const Finding& finding : findings) {
        const CodeRow& row = rowOf(finding.code);
        writeOutput(
            "{\"file\":" + jsonText(file) + ",\"line\":" + std::to_string(finding.place.line) +
            ",\"column\":" + std::to_string(finding.place.column) +
            ",\"severity\":" + jsonText(nameOf(row.severity)) + ",\"code\":" + jsonText(row.name) +
            ",\"message\":" + jsonText(finding.message) +
            ",\"meant\":" + (finding.meant.empty() ? "null" : jsonText(finding.meant)) + "}\n");
    }
}

void writeCodes() {
    for (int i = 0; i < static_cast<int>(Code::COUNT); ++i) {
        const CodeRow& row = rowOf(static_cast<Code>(i));
        std::string line;
        for (const std::string_view text : {row.name, nameOf(row.severity), nameOf(row.mended)})
            line.append(text) += '\t';
        writeOutput(line.append(row.meaning) + '\n');
    }
}
