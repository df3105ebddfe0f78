#include <algorithm>

#include "Text.h"
#include "findings/Findings.h"

namespace {

std::string counted(std::size_t count, const std::string& what) {
    return std::to_string(count) + ' ' + what + (count == 1 ? "" : "s");
}

bool isUtf16(std::string_view bytes) {
    return beginsWith(bytes, "\xFF\xFE") || beginsWith(bytes, "\xFE\xFF");
}

void findLineEnds(const Source& source, Findings& to) {
    const std::vector<std::size_t>& returns = source.carriageReturns();
    if (returns.empty()) return;
    std::vector<Edit> edits;
    for (const std::size_t offset : returns)
        edits.push_back({offset, offset + 1, ""});
    tell(to, Code::BYTES_CRLF, source.placeOf(returns.front()),
         counted(returns.size(), "line") + " of the file, from this one on, " +
             (returns.size() == 1 ? "ends" : "end") +
             " as on Windows: the carriage return becomes part of the last word, number or file "
             "name",
         {}, std::move(edits));
}

void findMark(const Source& source, Findings& to) {
    if (!source.hasMark()) return;
    tell(to, Code::BYTES_MARK, {1, 1},
         "the file begins with a byte order mark, which becomes part of the first line: it means "
         "nothing then",
         {}, {{0, 3, ""}});
}

void findNul(const Source& source, Findings& to) {
    const std::string& bytes = source.bytes();
    const std::size_t first = bytes.find('\0');
    if (first == bytes.npos) return;
    const auto count = static_cast<std::size_t>(std::count(bytes.begin(), bytes.end(), '\0'));
    tell(to, Code::BYTES_NUL, source.placeOf(first),
         "a NUL byte" + (count == 1 ? "" : " (the first of " + std::to_string(count) + ")") +
             ": the rest of the line is lost, and the next line is joined to this one");
}

// The first character that has no business in a configuration; a pattern may hold what colours a
// terminal.
void findOddCharacter(const SourceLine& line, Findings& to) {
    const bool pattern = line.text.find(".ConversionPattern") != line.text.npos;
    for (std::size_t i = 0; i < line.text.size();) {
        const std::size_t length = utf8Length(std::string_view(line.text).substr(i));
        const auto c = static_cast<unsigned char>(line.text[i]);
        const Piece piece(line, i, i + 1);
        if (length == 0) {
            return tell(to, Code::BYTES_UTF8, piece.place(),
                        printable(piece.text()) +
                            " is no UTF-8; it is used, and written to the log, as it stands");
        }
        if ((c < 0x20 && c != '\t' && !(pattern && c == '\033')) || c == 0x7F) {
            return tell(
                to, Code::BYTES_CONTROL, piece.place(),
                "a control character, " + printable(piece.text()) + ": it is used as it stands");
        }
        i += length;
    }
}

void findOpenComment(const Source& source, Findings& to) {
    if (source.openComment() == Source::kNone) return;
    tell(to, Code::COMMENT_OPEN, source.placeOf(source.openComment()),
         "Unterminated XML comment started: the rest of the file is not read");
}

}  // namespace

void findInBytes(const Source& source, Findings& to) {
    if (isUtf16(source.bytes())) {
        return tell(to, Code::BYTES_UTF16, {1, 1},
                    "the file is UTF-16, of which nothing is understood; save it as UTF-8");
    }
    findMark(source, to);
    findLineEnds(source, to);
    findNul(source, to);
    findOpenComment(source, to);
    for (const SourceLine& line : source.lines())
        findOddCharacter(line, to);
}
