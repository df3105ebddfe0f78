#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

// A range of the file's bytes, and what is to stand there instead.
struct Edit {
    std::size_t begin;
    std::size_t end;
    std::string replacement;
};

// For people: both count from 1, columns in bytes.
struct Place {
    unsigned line;
    std::size_t column;
};

// The content of one line as the library reads it, and where each of its characters stands.
struct SourceLine {
    unsigned lineno;              // as the library counts
    std::string text;             // what ConfigLines gives for it
    std::vector<std::size_t> at;  // offset in the file of each character
    std::size_t begin;            // the line in the file: it may begin within an XML comment,
    std::size_t end;              // and ends before its newline
};

// A configuration's bytes, taken apart as the library does. What editors of Windows add is left
// out of what is looked at, so that it is told once and not for every line.
class Source {
  public:
    static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

    explicit Source(std::string bytes);

    // The file as it is.
    const std::string& bytes() const { return _bytes; }
    // The same without the mark at its beginning and the carriage returns before newlines.
    const std::string& text() const { return _text; }
    bool hasMark() const { return _mark; }
    const std::vector<std::size_t>& carriageReturns() const { return _carriageReturns; }

    // The lines of text() that have content, in order.
    const std::vector<SourceLine>& lines() const { return _lines; }
    // The one with that number, which must be there.
    const SourceLine& line(unsigned lineno) const;
    // Where an XML comment begins that does not end; kNone without one.
    std::size_t openComment() const { return _openComment; }

    Place placeOf(std::size_t offset) const;

  private:
    class Reader;

    const std::string _bytes;
    std::string _text;
    std::vector<std::size_t> _origin;  // offset in the file of each byte of the text, and its end
    bool _mark = false;
    std::vector<std::size_t> _carriageReturns;
    std::vector<SourceLine> _lines;
    std::size_t _openComment = kNone;
};

// Part of a line's content.
class Piece {
  public:
    Piece(const SourceLine& line, std::size_t from, std::size_t to)
        : _line(&line), _from(from), _to(to) {}

    // The last `size` characters of the content: what the library quotes and stores are such tails.
    static Piece tail(const SourceLine& line, std::size_t size) {
        return {line, line.text.size() - size, line.text.size()};
    }

    const SourceLine& line() const { return *_line; }
    std::size_t from() const { return _from; }
    std::size_t to() const { return _to; }
    std::size_t size() const { return _to - _from; }
    std::string_view text() const { return std::string_view(_line->text).substr(_from, size()); }
    // A part of it.
    Piece part(std::size_t from, std::size_t size) const {
        return {*_line, _from + from, _from + from + size};
    }
    // Of its first character; of a line that an XML comment interrupts, the library's line.
    Place place() const;

    // No edit when an XML comment lies between its characters.
    std::vector<Edit> replacedBy(const std::string& text) const;
    // Takes it and all that follows it in the line away; a comment moves to a line of its own.
    std::vector<Edit> cutWithTail(const Source& source) const;

  private:
    bool isWhole() const;

    const SourceLine* _line;
    std::size_t _from;
    std::size_t _to;
};
