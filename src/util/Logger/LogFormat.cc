#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include "base/Assert.h"
#include "util/Logger/LogFormatCompiler.h"

#include <charconv>
#include <cstring>
#include <ctime>

inline namespace korvex {

namespace {

// One piece of a line, before it is padded or cut. It does not own what it points to.
struct Text {
    const char* data;
    unsigned long size;
};

Text textOf(const char* s) {
    return {s, std::strlen(s)};
}

// A stamp before the epoch prints as a very large number: the difference is read as unsigned.
unsigned long long msecSinceEpoch(const LogMsgMetadata& md) {
    return static_cast<unsigned long long>(Timeval::msecDifference(md.stamp, epoch_timeval()));
}

}  // namespace

// What the atoms of one line share.
class KORVEX_HIDDEN LogFormat::Line {
  public:
    Line(std::string& out, const LogMsgMetadata& md, const std::string& msg)
        : _out(out), _md(md), _msg(msg) {}

    void append(const Atom& atom) {
        if (atom.what == Atom::TIME_FMT && atom.minw == 0 && isUnlimited(atom)) {
            atom.arg.fdate->fmt(_out, _tm, _md);
        } else {
            fit(atom, text(atom));
        }
    }

  private:
    // All bits set is no limit, even for a text of 4 GiB and more.
    static bool isUnlimited(const Atom& atom) { return atom.maxw == static_cast<unsigned>(-1); }

    Text text(const Atom& atom);
    Text category() const;
    Text level() const;
    Text number(unsigned long long value);
    Text date(const LogFormattedDate& layout);
    void fit(const Atom& atom, const Text& text);

    std::string& _out;
    const LogMsgMetadata& _md;
    const std::string& _msg;
    CachedTm _tm;  // shared, so that all dates of the line show the same time
    std::string _dateText;
    char _digits[20];  // of 64 bits
};

Text LogFormat::Line::text(const Atom& atom) {
    switch (atom.what) {
        case Atom::MSG:
            return {_msg.data(), _msg.size()};
        case Atom::STR:
            return {atom.arg.str, atom.slen};
        case Atom::CATEGORY:
            return category();
        case Atom::LEVEL:
            return level();
        case Atom::THREADNAME:
            return textOf(Thread::currentName());
        case Atom::EPOCH_MSEC:
            return number(msecSinceEpoch(_md));
        case Atom::EPOCH_SEC:
            return number(msecSinceEpoch(_md) / 1000);
        case Atom::TIME_PROC:
            return number(static_cast<unsigned long long>(std::clock()));
        case Atom::TIME_FMT:
            break;
    }
    KORVEX_ASSERT_AS(atom.what == Atom::TIME_FMT, "a->what == Atom::TIME_FMT");
    return date(*atom.arg.fdate);
}

// A logger whose constructor has not run yet has no name.
Text LogFormat::Line::category() const {
    const char* const name = _md.category->_channel_name;
    return name != nullptr ? Text{name, _md.category->_channel_name_len} : Text{"", 0};
}

Text LogFormat::Line::level() const {
    unsigned long len = 0;
    const char* const name = loglevel2str(&len, _md.level);
    return {name, len};
}

Text LogFormat::Line::number(unsigned long long value) {
    const char* const end = std::to_chars(_digits, _digits + sizeof _digits, value).ptr;
    return {_digits, static_cast<unsigned long>(end - _digits)};
}

Text LogFormat::Line::date(const LogFormattedDate& layout) {
    _dateText.clear();
    layout.fmt(_dateText, _tm, _md);
    return {_dateText.data(), _dateText.size()};
}

// A text that was cut is not padded, whatever its minimum.
void LogFormat::Line::fit(const Atom& atom, const Text& text) {
    if (atom.maxw < text.size) {
        _out.append(text.data, isUnlimited(atom) ? text.size : atom.maxw);
        return;
    }
    if (text.size >= atom.minw) {
        _out.append(text.data, text.size);
        return;
    }
    const unsigned long padding = atom.minw - text.size;
    if (atom.justify != 0) _out.append(padding, atom.justify);
    _out.append(text.data, text.size);
    if (atom.justify == 0) _out.append(padding, ' ');
}

LogFormat::LogFormat(const char* pattern) : _fmt(pattern) {
    Compiler(*this).compile();
}

LogFormat::~LogFormat() = default;

LogFormat::Atom* LogFormat::new_atom() {
    _atoms.emplace_back();
    return &_atoms.back();
}

void LogFormat::apply(std::string& out, const LogMsgMetadata& md, const std::string& msg) const {
    Line line(out, md, msg);
    for (const Atom& atom : _atoms)
        line.append(atom);
}

}  // namespace korvex
