#include "util/Logger/LayoutPieces.h"

#include <gmock/gmock.h>

namespace {

using testing::ElementsAre;

std::vector<LayoutPiece::What> kinds(const char* pattern) {
    std::vector<LayoutPiece::What> all;
    for (const LayoutPiece& piece : LayoutPieces::of(LogFormat(pattern)))
        all.push_back(piece.what);
    return all;
}

TEST(LayoutPiecesTest, EveryConversionIsAPieceOfItsKind) {
    EXPECT_THAT(
        kinds("%m%n%c%p%t%r%R%u%d"),
        ElementsAre(LayoutPiece::MESSAGE, LayoutPiece::LITERAL, LayoutPiece::CHANNEL,
                    LayoutPiece::LEVEL, LayoutPiece::THREAD, LayoutPiece::EPOCH_MSEC,
                    LayoutPiece::EPOCH_SEC, LayoutPiece::PROCESSOR_TIME, LayoutPiece::DATE));
}

TEST(LayoutPiecesTest, TextsAreAsTheyPrintAndUnknownLettersAreGone) {
    const auto pieces = LayoutPieces::of(LogFormat("50%% of%q %3n"));
    ASSERT_EQ(pieces.size(), 4U);
    EXPECT_EQ(pieces[0].literal, "50%");
    EXPECT_EQ(pieces[1].literal, " of");
    EXPECT_EQ(pieces[2].literal, " ");
    EXPECT_EQ(pieces[3].literal, "\n");
    EXPECT_EQ(pieces[3].minWidth, 3U);
}

TEST(LayoutPiecesTest, WidthsAndPaddingAreTold) {
    const auto pieces = LayoutPieces::of(LogFormat("%-8.20c%05p%t"));
    EXPECT_EQ(pieces[0].minWidth, 8U);
    EXPECT_EQ(pieces[0].maxWidth, 20U);
    EXPECT_EQ(pieces[0].padding, '\0');
    EXPECT_EQ(pieces[1].padding, '0');
    EXPECT_EQ(pieces[2].padding, ' ');
    EXPECT_EQ(pieces[2].maxWidth, LayoutPiece::kUnlimited);
}

TEST(LayoutPiecesTest, ADateIsCutAtItsMilliseconds) {
    const auto pieces = LayoutPieces::of(LogFormat("%d{%l %H:%M,%l%B}"));
    const auto& date = pieces.at(0).date;
    ASSERT_EQ(date.size(), 4U);
    EXPECT_TRUE(date[0].isMsec);
    EXPECT_EQ(date[1].pattern, " %H:%M,");
    EXPECT_FALSE(date[1].isMsec);
    EXPECT_TRUE(date[2].isMsec);
    EXPECT_EQ(date[3].pattern, "%B");
}

}  // namespace
