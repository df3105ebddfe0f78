#pragma once

#include <korvex/Export.h>

#include <ctime>
#include <string>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class LayoutPieces;
class LogMsgMetadata;

// The broken-down local time of the one message that is being laid out, converted at most once.
// Belongs to one thread and one message.
class CachedTm {
  public:
    // The message's stamp as local time. The first call converts md.stamp; later calls do not look
    // at md again. Aborts when the conversion fails, as Timeval::localtime does.
    const struct tm& get(const LogMsgMetadata& md);
    // strftime(3) of that: the length written, or 0 when `size` does not suffice.
    unsigned long ftime(char* buf, unsigned long size, const char* fmt, const LogMsgMetadata& md);

  private:
    struct tm _stamp {};
    bool _stampSet = false;
};

// A date layout, compiled once: a strftime(3) pattern extended by %l, the milliseconds in three
// digits. Named layouts, compared exactly: "DATE" is "%d %b %Y %H:%M:%S,%l", "ISO8601" (also no
// name, or an empty one) "%Y-%m-%d %H:%M:%S,%l", "ABSOLUTE" "%H:%M:%S,%l".
//
// The pattern is cut at the two characters %l without regard to what stands before them, so in
// "%%l" the second percent sign and the l are a milliseconds conversion.
//
// Immutable after construction; fmt() may be called from several threads at once.
class LogFormattedDate {
  public:
    // Compiles the `len` characters at `name`, which need not end in a NUL; a null `name` means
    // ISO 8601. Throws std::bad_alloc.
    LogFormattedDate(const char* name, unsigned long len);
    LogFormattedDate(const LogFormattedDate&) = delete;
    LogFormattedDate& operator=(const LogFormattedDate&) = delete;
    ~LogFormattedDate() = default;

    // Appends md's stamp, laid out, to `out`; `tm` must be fresh or have served the same md.
    // Throws std::length_error when a piece of the pattern stays empty although it is not made of
    // %p alone (strftime(3) cannot tell that from a buffer too small), and std::bad_alloc.
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
