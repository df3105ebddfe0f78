#pragma once

#include <korvex/util/Logger.h>

#include <stdexcept>
#include <string>
#include <vector>

// A part of a date: a conversion of strftime(3), 'l' for the milliseconds, or 0 for the text.
struct TimePart {
    char letter;
    std::string text;
};

// A level as a line shows it.
struct LevelWord {
    LogLevel level;  // EMERG + 1: none of the nine
    std::string name;
    std::string word;  // cut as the layout says
    std::string before;
    std::string behind;  // what fills it up
};

struct LineField {
    enum Kind { TEXT, TIME, LEVEL, CHANNEL, THREAD, UPTIME_MS, UPTIME_S, CPU_TICKS, MESSAGE };
    enum Filling { NONE, BLANKS_BEFORE, ZEROS_BEFORE, BLANKS_BEHIND };

    Kind kind;
    std::string text;              // TEXT
    std::vector<TimePart> time;    // TIME; the padding is part of it
    std::vector<LevelWord> words;  // LEVEL
    Filling filling = NONE;        // names and numbers
    bool repeated = false;         // a field of this kind stands before it
};

// Why lines of a layout cannot be taken apart.
class Doubt : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// What a line looks like: what stands before its message. Behind it is a newline, and the message
// may hold newlines of its own.
class LineShape {
  public:
    // Throws Doubt when lines of the layout could be taken apart in more than one way, or have no
    // complete time.
    explicit LineShape(const LogFormat& layout);

    const std::vector<LineField>& head() const { return _head; }
    const LineField* find(LineField::Kind kind) const;
    const LineField& time() const { return *find(LineField::TIME); }
    // Whether a channel of this name could not be told from what follows it in the line.
    bool hides(const std::string& channelName) const;

    // The layout nearest to this one whose lines can be taken apart.
    static std::string suggestion(const LogFormat& layout);

  private:
    std::vector<LineField> _head;
};

// How users of engines see the field: "time", "level" and so on.
const char* nameOf(LineField::Kind kind);

bool isBlank(const std::string& text);  // nothing but blanks and tabs
