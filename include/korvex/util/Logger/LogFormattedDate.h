#pragma once

#include <korvex/Export.h>

#include <ctime>
#include <string>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class LayoutPieces;
class LogMsgMetadata;

// The broken-down local time of one message, converted at most once. For one thread and one
// message.
class CachedTm {
  public:
    // The stamp of the message as local time. The first call converts md.stamp; later calls return
    // the same result, whatever md is. Aborts if the conversion fails, as Timeval::localtime does.
    const struct tm& get(const LogMsgMetadata& md);
    // strftime(3) of that time: the length written, or 0 if `size` is too small.
    unsigned long ftime(char* buf, unsigned long size, const char* fmt, const LogMsgMetadata& md);

  private:
    struct tm _stamp {};
    bool _stampSet = false;
};

// A date layout, compiled once: a strftime(3) pattern with one more conversion, %l, the
// milliseconds in three digits. Some patterns have names, which are case-sensitive:
//
//   "DATE"                               %d %b %Y %H:%M:%S,%l
//   "ISO8601", an empty name or no name  %Y-%m-%d %H:%M:%S,%l
//   "ABSOLUTE"                           %H:%M:%S,%l
//
// The two characters %l are a conversion whatever stands before them: "%%l" is a percent sign and
// the milliseconds.
//
// Immutable after construction. fmt() may be called from several threads at once.
class LogFormattedDate {
  public:
    // Compiles the `len` characters at `name`, which need not end in a NUL; a null `name` means
    // ISO 8601. Throws std::bad_alloc.
    LogFormattedDate(const char* name, unsigned long len);
    LogFormattedDate(const LogFormattedDate&) = delete;
    LogFormattedDate& operator=(const LogFormattedDate&) = delete;
    ~LogFormattedDate() = default;

    // Appends the stamp of md, formatted, to `out`. `tm` must be new, or used for the same md
    // before. Throws std::bad_alloc. Throws std::length_error if a part of the pattern yields no
    // text, unless it consists of %p only: strftime(3) returns 0 for that and for a buffer that is
    // too small.
    void fmt(std::string& out, CachedTm& tm, const LogMsgMetadata& md) const;

  private:
    struct Atom {
        enum What { STRFTIME = 0, MSEC = 1, NUMBERS = 2 };
        What what;
        std::string strft_fmt;  // STRFTIME, NUMBERS: the piece, as a pattern for strftime(3)
        bool may_be_empty;      // STRFTIME: the piece is empty or made of %p alone
        unsigned long limit;    // STRFTIME: no output of the piece can be as long as this
    };
    class Scratch;
    friend class LayoutPieces;

    void appendStrftime(std::string& out, Scratch& scratch, const Atom& atom, CachedTm& tm,
                        const LogMsgMetadata& md) const;

    std::vector<Atom> _atoms;
};

}  // KORVEX_NAMESPACE(korvex)
