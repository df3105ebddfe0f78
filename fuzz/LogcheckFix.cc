#include <korvex/util/Logger.h>

#include <algorithm>
#include <cstdio>

#include "Check.h"
#include "Fix.h"
#include "Input.h"
#include "base/Stream.h"
#include "util/Logger/ConfigLines.h"

namespace {

// The lines are those that the library reads.
void checkLines(const Source& source) {
    if (source.text().empty()) return;
    const Stream file(fmemopen(const_cast<char*>(source.text().data()), source.text().size(), "r"));
    ConfigLines lines(file.get());
    std::string content;
    for (const SourceLine& line : source.lines()) {
        check(lines.next(content), "a line that the library does not read");
        checkSame(line.text, content, "a line");
        check(line.lineno == lines.lineno(), "a line's number");
        check(line.at.size() == line.text.size(), "the places of a line");
        for (std::size_t i = 0; i < line.at.size(); ++i) {
            check(source.bytes()[line.at[i]] == line.text[i], "a character's place");
            check(i == 0 || line.at[i - 1] < line.at[i], "the order of the places");
        }
    }
    check(!lines.next(content), "a line that only the library reads");
    check((source.openComment() != Source::kNone) ==
              (lines.xml_comment_startline() != ConfigLines::kNone),
          "an open comment");
}

void checkFindings(const Source& source, const Findings& findings) {
    for (const Finding& finding : findings) {
        check(finding.place.line >= 1 && finding.place.column >= 1, "a finding's place");
        check(finding.message.find('\n') == std::string::npos, "a message is one line");
        const bool never = rowOf(finding.code).mended == Mended::NO;
        check(finding.edits.empty() || !never, "a finding that is never mended");
        std::size_t size = 0;
        for (const Edit& edit : finding.edits) {
            check(edit.begin <= edit.end && edit.end <= source.bytes().size(), "an edit's place");
            size += edit.end - edit.begin + edit.replacement.size();
        }
        check(finding.edits.empty() || size > 0, "an edit that changes nothing");
    }
}

bool isOutside(std::size_t offset, const Findings& findings) {
    for (const Finding& finding : findings) {
        for (const Edit& edit : finding.edits) {
            if (offset >= edit.begin && offset < edit.end) return false;
        }
    }
    return true;
}

// Every byte that no finding speaks of is still there, in order.
void checkRest(const std::string& before, const std::string& after, const Findings& findings) {
    std::size_t pos = 0;
    for (std::size_t i = 0; i < before.size(); ++i) {
        if (!isOutside(i, findings)) continue;
        pos = after.find(before[i], pos);
        check(pos != after.npos, "a byte outside the edits is gone");
        ++pos;
    }
}

}  // namespace

// What is told of a configuration is mended, in each round only what is told, and then comes to
// rest with nothing left that could be mended.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string bytes = Input(data, size).rest();
    const Pathname home("/opt/home");
    const Source source(bytes);
    checkLines(source);
    const Findings findings = findAll(source, {home, {}});
    checkFindings(source, findings);
    const std::string next = applied(bytes, findings);
    checkRest(bytes, next, findings);
    const bool any = std::any_of(findings.begin(), findings.end(),
                                 [](const Finding& finding) { return !finding.edits.empty(); });
    check(any == (next != bytes), "edits change something, and nothing else does");
    const std::string rest = mended(bytes, home);
    for (const Finding& finding : findAll(Source(rest), {home, {}}))
        check(finding.edits.empty(), "what is mended is not found again");
    checkSame(mended(rest, home), rest, "mended twice");
    return 0;
}
