#include <korvex/util/Logger/LogFormattedDate.h>

#include <korvex/util/Logger/LogMsgMetadata.h>

#include "base/Digits.h"
#include "platform/LibcLock.h"

#include <algorithm>
#include <charconv>
#include <limits>
#include <memory>
#include <stdexcept>
#include <string_view>

inline namespace korvex {

namespace {

constexpr std::string_view kIso8601 = "%Y-%m-%d %H:%M:%S,%l";

// The longest text that a pattern without widths may produce in any locale. With a buffer of this
// size, an empty result does not mean that the buffer is too small.
constexpr unsigned long kAmpleOutput = 4UL << 20;

constexpr unsigned long kFirstBuffer = 64;  // bytes that strftime(3) is offered first

constexpr std::size_t kLongestNumber = 4;  // a year's digits

std::string_view choosePattern(const char* name, unsigned long len) {
    if (name == nullptr || len == 0) return kIso8601;
    const std::string_view text(name, len);
    if (text == "DATE") return "%d %b %Y %H:%M:%S,%l";
    if (text == "ISO8601") return kIso8601;
    if (text == "ABSOLUTE") return "%H:%M:%S,%l";
    return text;
}

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

bool isOneOf(char c, std::string_view set) {
    return set.find(c) != std::string_view::npos;
}

// Whether the piece is made of nothing but %p conversions, which some locales leave empty, or is
// itself empty. It ends at its first NUL, as strftime reads it.
bool isAllAmPm(const char* p) {
    while (*p != '\0') {
        if (*p++ != '%') return false;
        if (*p != '\0' && isOneOf(*p, "_-^#")) ++p;
        while (isDigit(*p))
            ++p;
        if (*p == 'E' || *p == 'O') ++p;
        if (*p++ != 'p') return false;
    }
    return true;
}

// Whether the piece holds no other conversions than those that no locale changes. Written without
// strftime(3) they take a fifth of the time off a line with an ISO 8601 date. (A text made of these
// also follows tzset(3) and setlocale(3), as one kept from the last line might not.) A piece that
// may not fit strftime's first buffer is left to it: the buffer's growth shows in a later piece,
// where a %p wider than the buffer is taken for an empty one.
bool isAllNumbers(std::string_view piece) {
    if (piece.size() * kLongestNumber / 2 >= kFirstBuffer) return false;
    for (std::size_t i = 0; i < piece.size(); ++i) {
        if (piece[i] == '\0') return false;
        if (piece[i] == '%' && (++i == piece.size() || !isOneOf(piece[i], "YmdHMS"))) return false;
    }
    return true;
}

// Three digits, also of a stamp whose microseconds are out of their range.
void appendMsec(std::string& out, unsigned msec) {
    char digits[10];
    const auto size =
        static_cast<std::size_t>(std::to_chars(digits, digits + sizeof digits, msec).ptr - digits);
    if (size < 3) out.append(3 - size, '0');
    out.append(digits, std::min<std::size_t>(size, 3));
}

// Writes the number of one such conversion. Returns the place after it.
char* writeNumber(char* to, char conversion, const struct tm& tm) {
    switch (conversion) {
        case 'Y':
            // A stamp's seconds have 32 bits, so years go from 1901 to 2038.
            to = twoDigits(to, tm.tm_year / 100 + 19);
            return twoDigits(to, tm.tm_year % 100);
        case 'm':
            return twoDigits(to, tm.tm_mon + 1);
        case 'd':
            return twoDigits(to, tm.tm_mday);
        case 'H':
            return twoDigits(to, tm.tm_hour);
        case 'M':
            return twoDigits(to, tm.tm_min);
        default:
            return twoDigits(to, tm.tm_sec);
    }
}

void appendNumbers(std::string& out, const std::string& piece, const struct tm& tm) {
    const std::size_t before = out.size();
    out.resize(before + piece.size() * kLongestNumber / 2);
    char* to = &out[before];
    for (const char* p = piece.c_str(); *p != '\0'; ++p) {
        if (*p == '%') {
            to = writeNumber(to, *++p, tm);
        } else {
            *to++ = *p;
        }
    }
    out.resize(static_cast<std::size_t>(to - out.data()));
}

// A length that no output of the piece can reach. Every number in the piece counts as a width.
unsigned long outputLimit(const std::string& piece) {
    constexpr unsigned long most = std::numeric_limits<unsigned long>::max() / 4;
    unsigned long limit = kAmpleOutput + piece.size() * 64;
    unsigned long width = 0;
    for (const char c : piece) {
        width = isDigit(c) ? width * 10 + static_cast<unsigned long>(c - '0') : 0;
        if (width > most || limit > most) return most;
        limit += width;
    }
    return limit;
}

}  // namespace

const struct tm& CachedTm::get(const LogMsgMetadata& md) {
    if (!_stampSet) {
        md.stamp.localtime(_stamp);
        _stampSet = true;
    }
    return _stamp;
}

unsigned long CachedTm::ftime(char* buf, unsigned long size, const char* fmt,
                              const LogMsgMetadata& md) {
    const struct tm& stamp = get(md);
    const LibcLock lock;
    return std::strftime(buf, size, fmt, &stamp);
}

// The memory strftime writes to: local at first, grown by doubling, kept for the later pieces.
class KORVEX_HIDDEN LogFormattedDate::Scratch {
  public:
    char* data() { return _heap ? _heap.get() : _local; }
    unsigned long size() const { return _size; }
    void grow() {
        _heap.reset(new char[_size * 2]);
        _size *= 2;
    }

  private:
    char _local[kFirstBuffer];
    std::unique_ptr<char[]> _heap;
    unsigned long _size = sizeof _local;
};

LogFormattedDate::LogFormattedDate(const char* name, unsigned long len) {
    std::string_view rest = choosePattern(name, len);
    while (!rest.empty()) {
        const std::size_t msec = rest.find("%l");
        if (msec == 0) {
            _atoms.push_back({Atom::MSEC, {}, false, 0});
            rest.remove_prefix(2);
            continue;
        }
        std::string piece(rest.substr(0, msec));
        rest.remove_prefix(piece.size());
        if (isAllNumbers(piece)) {
            _atoms.push_back({Atom::NUMBERS, std::move(piece), false, 0});
            continue;
        }
        const bool may_be_empty = isAllAmPm(piece.c_str());
        const unsigned long limit = outputLimit(piece);
        _atoms.push_back({Atom::STRFTIME, std::move(piece), may_be_empty, limit});
    }
}

void LogFormattedDate::fmt(std::string& out, CachedTm& tm, const LogMsgMetadata& md) const {
    Scratch scratch;
    for (const Atom& atom : _atoms) {
        switch (atom.what) {
            case Atom::MSEC:
                appendMsec(out, static_cast<unsigned>(md.stamp.msec()));
                break;
            case Atom::NUMBERS:
                appendNumbers(out, atom.strft_fmt, tm.get(md));
                break;
            case Atom::STRFTIME:
                appendStrftime(out, scratch, atom, tm, md);
        }
    }
}

void LogFormattedDate::appendStrftime(std::string& out, Scratch& scratch, const Atom& atom,
                                      CachedTm& tm, const LogMsgMetadata& md) const {
    for (;;) {
        const unsigned long n =
            tm.ftime(scratch.data(), scratch.size(), atom.strft_fmt.c_str(), md);
        if (n == 0 && atom.may_be_empty) return;
        if (n != 0 && n < scratch.size()) {
            out.append(scratch.data(), n);
            return;
        }
        if (scratch.size() > atom.limit) {
            throw std::length_error("date layout yields nothing: " + atom.strft_fmt);
        }
        scratch.grow();
    }
}

}  // namespace korvex
