#pragma once

#include <cstdio>
#include <string>

inline namespace korvex {

// The lines of a logging configuration, without XML comments and without what follows "#".
class ConfigLines {
  public:
    static constexpr unsigned kNone = static_cast<unsigned>(-1);

    // Reads from `file`, which it does not own.
    explicit ConfigLines(std::FILE* file) : _file(file) {}

    // The content of the next line that is not empty; false at the end of the file. The content
    // includes one character after the last one that is not a blank: a blank that follows a value,
    // or the "#" after it, is part of the value. Existing configurations depend on that.
    bool next(std::string& content);

    // The number of the last line read, from 1; comment lines count.
    unsigned lineno() const { return lineno_; }

    // The line of the XML comment that is not closed at the end of the file; kNone if there is
    // none.
    unsigned xml_comment_startline() const { return xml_comment_startline_; }

  private:
    bool nextRaw();
    void joinAroundComments(std::string& joined);
    bool handle_xml_comment(std::size_t& pos);

    std::FILE* const _file;
    std::string _line;  // as it stands in the file
    unsigned lineno_ = 0;
    unsigned xml_comment_startline_ = kNone;
};

// Reads one line, of any length, without its newline; false at the end of the file. After a NUL,
// the rest of the piece in which it was read is lost; the line continues with the next piece.
bool read_line(std::string& result, std::FILE* ifile);

}  // namespace korvex
