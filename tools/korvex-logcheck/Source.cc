#include "Source.h"

#include <algorithm>
#include <utility>

namespace {

constexpr std::string_view kMark = "\xEF\xBB\xBF";
constexpr std::string_view kCommentStart = "<!--";
constexpr std::string_view kCommentEnd = "-->";
constexpr std::size_t kPieceOfLine = 127;  // what the library's buffer takes at a time

// Characters and where they stand.
struct Placed {
    std::string text;
    std::vector<std::size_t> at;

    void add(char c, std::size_t offset) {
        text += c;
        at.push_back(offset);
    }
    void resize(std::size_t size) {
        text.resize(size);
        at.resize(size);
    }
    bool endsWith(std::string_view tail) const {
        return text.size() >= tail.size() &&
               text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
    }
};

}  // namespace

// Does what ConfigLines does, step by step, and keeps the places besides. A test and a fuzzer
// compare the two.
class Source::Reader {
  public:
    explicit Reader(Source& source) : _source(source) {}

    void readAll() {
        while (nextRaw()) {
            Placed content;
            joinAroundComments(content);
            cutToContent(content);
            if (content.text.empty()) continue;
            _source._lines.push_back(
                {_lineno, std::move(content.text), std::move(content.at), _begin, _end});
        }
    }

  private:
    bool nextRaw() {
        _raw.resize(0);
        const std::size_t begin = _source._origin[_pos];
        if (!readRaw()) return false;
        _begin = begin;
        ++_lineno;
        return true;
    }

    // A NUL ends what is used of the piece in which it is read, and the line goes on with the next.
    bool readRaw() {
        const std::string_view text = _source._text;
        while (_pos < text.size()) {
            std::string_view piece = text.substr(_pos, kPieceOfLine);
            piece = piece.substr(0, std::min(piece.find('\n'), piece.size() - 1) + 1);
            const std::size_t used =
                std::min(piece.find_first_of(std::string_view("\n\0", 2)), piece.size());
            for (std::size_t i = 0; i < used; ++i)
                _raw.add(piece[i], _source._origin[_pos + i]);
            _pos += piece.size();
            if (used == piece.size() || piece[used] != '\n') continue;
            _end = _source._origin[_pos - 1];
            // The carriage return before a newline is no part of the line.
            if (_end > 0 && _source._bytes[_end - 1] == '\r') --_end;
            return true;
        }
        _end = _source._bytes.size();
        return !_raw.text.empty();
    }

    void joinAroundComments(Placed& joined) {
        for (std::size_t pos = 0; pos < _raw.text.size();) {
            const char c = _raw.text[pos];
            joined.add(c, _raw.at[pos++]);
            if (c == '#') return;
            if (c != '-' || !joined.endsWith(kCommentStart)) continue;
            joined.resize(joined.text.size() - kCommentStart.size() + 1);
            _source._openComment = joined.at.back();
            joined.resize(joined.text.size() - 1);
            if (!skipComment(pos)) return;
            _source._openComment = kNone;
        }
    }

    bool skipComment(std::size_t& pos) {
        for (;;) {
            const std::size_t end = _raw.text.find(kCommentEnd, pos);
            if (end != std::string::npos) {
                pos = end + kCommentEnd.size();
                return true;
            }
            if (!nextRaw()) return false;
            pos = 0;
        }
    }

    static void cutToContent(Placed& line) {
        const std::string& text = line.text;
        const std::size_t comment = std::min(text.find('#'), text.size());
        const std::size_t last =
            comment == 0 ? text.npos : text.find_last_not_of(" \t", comment - 1);
        line.resize(last == text.npos ? 0 : std::min(last + 2, text.size()));
    }

    Source& _source;
    std::size_t _pos = 0;
    Placed _raw;
    unsigned _lineno = 0;
    std::size_t _begin = 0;
    std::size_t _end = 0;
};

Source::Source(std::string bytes) : _bytes(std::move(bytes)) {
    _mark = _bytes.compare(0, kMark.size(), kMark) == 0;
    for (std::size_t i = _mark ? kMark.size() : 0; i < _bytes.size(); ++i) {
        if (_bytes[i] == '\r' && i + 1 < _bytes.size() && _bytes[i + 1] == '\n') {
            _carriageReturns.push_back(i);
            continue;
        }
        _text += _bytes[i];
        _origin.push_back(i);
    }
    _origin.push_back(_bytes.size());
    Reader(*this).readAll();
}

const SourceLine& Source::line(unsigned lineno) const {
    return *std::lower_bound(_lines.begin(), _lines.end(), lineno,
                             [](const SourceLine& line, unsigned n) { return line.lineno < n; });
}

Place Source::placeOf(std::size_t offset) const {
    const std::string_view before = std::string_view(_bytes).substr(0, offset);
    const auto line = static_cast<unsigned>(std::count(before.begin(), before.end(), '\n')) + 1;
    const std::size_t newline = before.rfind('\n');
    return {line, offset - (newline == before.npos ? 0 : newline + 1) + 1};
}

Place Piece::place() const {
    const std::vector<std::size_t>& at = _line->at;
    std::size_t offset = _from < at.size() ? at[_from] : at.back() + 1;
    if (offset < _line->begin) {
        const auto first = std::lower_bound(at.begin(), at.end(), _line->begin);
        offset = first == at.end() ? _line->begin : *first;
    }
    return {_line->lineno, offset - _line->begin + 1};
}

bool Piece::isWhole() const {
    return size() == 0 || _line->at[_to - 1] - _line->at[_from] == size() - 1;
}

std::vector<Edit> Piece::replacedBy(const std::string& text) const {
    if (size() == 0 || !isWhole()) return {};
    return {{_line->at[_from], _line->at[_to - 1] + 1, text}};
}

std::vector<Edit> Piece::cutWithTail(const Source& source) const {
    const Piece all(*_line, 0, _line->text.size());
    if (size() == 0 || !all.isWhole() || _line->at.front() != _line->begin) return {};
    const std::string_view bytes = source.bytes();
    const std::string_view line = bytes.substr(_line->begin, _line->end - _line->begin);
    if (line.find_first_of(std::string_view("\0\n", 2)) != line.npos) return {};
    std::vector<Edit> edits;
    const std::size_t comment = line.find('#');
    if (comment != line.npos) {
        const std::string moved(line.substr(comment));
        edits.push_back({_line->begin, _line->begin, moved + '\n'});
    }
    edits.push_back({_line->at[_from], _line->end, ""});
    return edits;
}
