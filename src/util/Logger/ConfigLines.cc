#include "util/Logger/ConfigLines.h"

#include "base/Assert.h"

#include <algorithm>
#include <cstring>
#include <string_view>

inline namespace korvex {

namespace {

constexpr std::string_view kCommentStart = "<!--";
constexpr std::string_view kCommentEnd = "-->";

bool endsWith(const std::string& text, std::string_view tail) {
    return text.size() >= tail.size() &&
           text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

// The text before the "#", without blanks at its end except one. Empty if there are only blanks.
void cutToContent(std::string& line) {
    const std::size_t comment = std::min(line.find('#'), line.size());
    const std::size_t last = comment == 0 ? line.npos : line.find_last_not_of(" \t", comment - 1);
    line.resize(last == line.npos ? 0 : std::min(last + 2, line.size()));
}

}  // namespace

bool read_line(std::string& result, std::FILE* ifile) {
    result.clear();
    char buf[128];
    for (;;) {
        const char* const p = std::fgets(buf, sizeof buf, ifile);
        if (p == nullptr) return !result.empty();
        KORVEX_ASSERT(p == buf);
        const std::size_t length = std::strcspn(p, "\n");
        result.append(p, length);
        if (p[length] == '\n') return true;
    }
}

bool ConfigLines::nextRaw() {
    if (!read_line(_line, _file)) return false;
    ++lineno_;
    return true;
}

bool ConfigLines::next(std::string& content) {
    while (nextRaw()) {
        joinAroundComments(content);
        cutToContent(content);
        if (!content.empty()) return true;
    }
    return false;
}

// Copies the line up to and including its "#", without XML comments. The texts before and after a
// comment are joined, and may form the start of another comment. A single pass finds that too,
// because it searches the copy and not the line.
void ConfigLines::joinAroundComments(std::string& joined) {
    joined.clear();
    for (std::size_t pos = 0; pos < _line.size();) {
        const std::size_t length = std::strcspn(&_line[pos], "#-");
        joined.append(_line, pos, length + 1);
        pos += length + 1;
        if (joined.back() == '#') return;
        if (joined.back() != '-' || !endsWith(joined, kCommentStart)) continue;
        joined.resize(joined.size() - kCommentStart.size());
        xml_comment_startline_ = lineno_;
        if (!handle_xml_comment(pos)) return;
        xml_comment_startline_ = kNone;
    }
}

// Continues after the end of the comment, on whatever line that is. False if the file ends before
// it.
bool ConfigLines::handle_xml_comment(std::size_t& pos) {
    for (;;) {
        const std::size_t end = _line.find(kCommentEnd, pos);
        if (end != _line.npos) {
            pos = end + kCommentEnd.size();
            return true;
        }
        if (!nextRaw()) return false;
        pos = 0;
    }
}

}  // namespace korvex
