#include "util/Logger/LogFormatCompiler.h"

#include <korvex/util/Logger/LogFormattedDate.h>

#include "base/Assert.h"

#include <climits>
#include <cstring>

inline namespace korvex {

namespace {

constexpr unsigned int kUnlimited = UINT_MAX;

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

}  // namespace

void LogFormat::Compiler::compile() {
    for (;;) {
        literalRuns();
        if (*_p == '\0') return;
        if (!conversion()) return;
    }
}

// The text up to the next conversion. A "%%" ends the text after its first percent sign, and both
// are skipped, so it prints one.
void LogFormat::Compiler::literalRuns() {
    const char* run = _p;
    while (const char* percent = std::strchr(_p, '%')) {
        if (percent[1] != '%') {
            literal(run, percent);
            _p = percent;
            return;
        }
        literal(run, percent + 1);
        run = _p = percent + 2;
    }
    _p = run + std::strlen(run);
    literal(run, _p);
}

void LogFormat::Compiler::literal(const char* from, const char* to) {
    if (from == to) return;
    Atom& atom = *_format.new_atom();
    atom.what = Atom::STR;
    atom.arg.str = from;
    atom.slen = static_cast<unsigned long>(to - from);
    // A literal is its own width: it is never padded or cut, not even one of 4 GiB and more.
    atom.maxw = kUnlimited;
}

// One conversion. False if the pattern ends inside it; then there is no atom for it, and the
// compilation ends.
bool LogFormat::Compiler::conversion() {
    KORVEX_ASSERT_AS(*_p == '%', "*p == '%'");
    ++_p;
    Atom atom{};
    flagAndWidths(atom);
    const char letter = *_p;
    if (letter == '\0') return false;
    ++_p;
    const char* argBegin = nullptr;
    const char* argEnd = nullptr;
    if (!braceArgument(argBegin, argEnd)) return false;
    if (set(atom, letter, argBegin, argEnd)) *_format.new_atom() = atom;
    return true;
}

void LogFormat::Compiler::flagAndWidths(Atom& atom) {
    atom.maxw = kUnlimited;
    atom.justify = ' ';
    if (*_p == '-' || *_p == '0') {
        atom.justify = *_p == '0' ? '0' : '\0';
        ++_p;
    }
    atom.minw = number();
    if (*_p == '.') {
        ++_p;
        if (isDigit(*_p)) atom.maxw = number();
    }
}

// A run of digits; 0 if there is none. A number that is too large becomes the largest.
unsigned int LogFormat::Compiler::number() {
    unsigned int n = 0;
    for (; isDigit(*_p); ++_p) {
        const unsigned int digit = static_cast<unsigned int>(*_p - '0');
        n = n > (UINT_MAX - digit) / 10 ? UINT_MAX : n * 10 + digit;
    }
    return n;
}

// Moves past "{...}", if one follows; false when it is never closed.
bool LogFormat::Compiler::braceArgument(const char*& begin, const char*& end) {
    if (*_p != '{') return true;
    begin = _p + 1;
    end = std::strchr(begin, '}');
    if (end == nullptr) return false;
    _p = end + 1;
    return true;
}

// Sets the atom for the letter. False for an unknown letter.
bool LogFormat::Compiler::set(Atom& atom, char letter, const char* argBegin, const char* argEnd) {
    static constexpr struct {
        char letter;
        Atom::What what;
    } kConversions[] = {
        {'m', Atom::MSG},       {'n', Atom::STR},        {'c', Atom::CATEGORY},
        {'p', Atom::LEVEL},     {'t', Atom::THREADNAME}, {'r', Atom::EPOCH_MSEC},
        {'R', Atom::EPOCH_SEC}, {'u', Atom::TIME_PROC},  {'d', Atom::TIME_FMT},
    };
    for (const auto& entry : kConversions) {
        if (entry.letter != letter) continue;
        atom.what = entry.what;
        if (atom.what == Atom::STR) {
            atom.arg.str = "\n";
            atom.slen = 1;
        } else if (atom.what == Atom::TIME_FMT) {
            const auto len = static_cast<unsigned long>(argEnd - argBegin);
            _format._dates.emplace_back(argBegin, len);
            atom.arg.fdate = &_format._dates.back();
        }
        return true;
    }
    return false;
}

}  // namespace korvex
