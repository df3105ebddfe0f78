#pragma once

#include <korvex/Export.h>
#include <korvex/util/Logger/LogFormat.h>

#include <string>
#include <vector>

inline namespace korvex {

// A piece of a date: a pattern for strftime(3), or the milliseconds in three digits.
struct DatePiece {
    bool isMsec;
    std::string pattern;
};

// A conversion of a layout, or the text between two.
struct LayoutPiece {
    enum What {
        LITERAL,
        MESSAGE,
        CHANNEL,
        LEVEL,
        THREAD,
        EPOCH_MSEC,
        EPOCH_SEC,
        PROCESSOR_TIME,
        DATE,
        OTHER  // an atom that this class does not know
    };
    static constexpr unsigned kUnlimited = ~0U;

    What what;
    std::string literal;
    std::vector<DatePiece> date;
    unsigned minWidth;
    unsigned maxWidth;  // bytes; kUnlimited
    char padding;       // pads before the text; 0: blanks after it
};

// The parts of a compiled layout, for a tool that must know what its lines look like.
class KORVEX_HIDDEN LayoutPieces {
  public:
    static std::vector<LayoutPiece> of(const LogFormat& layout);

  private:
    static std::vector<DatePiece> of(const LogFormattedDate& date);
};

}  // namespace korvex
