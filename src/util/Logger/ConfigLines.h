#pragma once

#include <cstdio>
#include <string>

inline namespace korvex {

// The lines of a logging configuration, without XML comments and without what stands behind "#".
class ConfigLines {
  public:
    static constexpr unsigned kNone = static_cast<unsigned>(-1);

    // Reads from `file`, which it does not own.
    explicit ConfigLines(std::FILE* file) : _file(file) {}

    // The content of the next line that has any; false at the end of the file. A line's content
    // reaches one character beyond its last one that is no blank: a blank that follows a value, or
    // the "#" that ends it, belongs to it. Configurations in use depend on what follows from that.
    bool next(std::string& content);

    // The number of the last line read, from 1; comment lines count.
    unsigned lineno() const { return lineno_; }

    // Where an XML comment began that the file's end has not closed; kNone when there is none.
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

// Reads one line, of any length, without its newline; false at the end of the file. A NUL ends
// what is used of the piece in which it is read, and the line goes on with the next piece.
bool read_line(std::string& result, std::FILE* ifile);

}  // namespace korvex
