#include "util/Logger/LayoutPieces.h"

#include <korvex/util/Logger/LogFormattedDate.h>

inline namespace korvex {

std::vector<DatePiece> LayoutPieces::of(const LogFormattedDate& date) {
    std::vector<DatePiece> pieces;
    for (const LogFormattedDate::Atom& atom : date._atoms)
        pieces.push_back({atom.what == LogFormattedDate::Atom::MSEC, atom.strft_fmt});
    return pieces;
}

std::vector<LayoutPiece> LayoutPieces::of(const LogFormat& layout) {
    using Atom = LogFormat::Atom;
    static constexpr struct {
        Atom::What atom;
        LayoutPiece::What piece;
    } kinds[] = {
        {Atom::MSG, LayoutPiece::MESSAGE},
        {Atom::STR, LayoutPiece::LITERAL},
        {Atom::CATEGORY, LayoutPiece::CHANNEL},
        {Atom::LEVEL, LayoutPiece::LEVEL},
        {Atom::THREADNAME, LayoutPiece::THREAD},
        {Atom::EPOCH_MSEC, LayoutPiece::EPOCH_MSEC},
        {Atom::EPOCH_SEC, LayoutPiece::EPOCH_SEC},
        {Atom::TIME_FMT, LayoutPiece::DATE},
        {Atom::TIME_PROC, LayoutPiece::PROCESSOR_TIME},
    };
    std::vector<LayoutPiece> pieces;
    for (const Atom& atom : layout._atoms) {
        LayoutPiece piece{LayoutPiece::OTHER, {}, {}, atom.minw, atom.maxw, atom.justify};
        for (const auto& kind : kinds)
            if (kind.atom == atom.what) piece.what = kind.piece;
        if (atom.what == Atom::STR) piece.literal.assign(atom.arg.str, atom.slen);
        if (atom.what == Atom::TIME_FMT) piece.date = of(*atom.arg.fdate);
        pieces.push_back(std::move(piece));
    }
    return pieces;
}

}  // namespace korvex
