// Where a row puts its key and value: the arithmetic shared by the graphical and the terminal rows.
#include "ui/CellLayout.h"

#include <gtest/gtest.h>

namespace velmar {
namespace {

const CellMetrics kPoints{10, 50, 50};

TEST(CellLayoutTest, KeyOnlyRowCentresTheKeyAfterTheMargin) {
    // Content (0, 0, 286, 44), key 80 x 18: (0 + 10, (44 - 18) / 2) = (10, 13).
    EXPECT_EQ(layoutKeyOnlyCell({0, 0, 286, 44}, {80, 18}, kPoints), (CellRect{10, 13, 80, 18}));
    // Odd leftovers truncate: (45 - 18) / 2 = 13.
    EXPECT_EQ(layoutKeyOnlyCell({4, 0, 286, 45}, {80, 18}, kPoints), (CellRect{14, 13, 80, 18}));
}

TEST(CellLayoutTest, APairThatFitsPutsTheValueFlushAgainstTheRightEdge) {
    // need = 100 + 10 + 50 + 60 = 220 < 320: value x = 320 - 60 = 260.
    const KeyValueCellLayout layout = layoutKeyValueCell({0, 0, 320, 50}, {100, 18}, {60, 18}, kPoints);
    EXPECT_EQ(layout.key, (CellRect{10, 16, 100, 18}));
    EXPECT_EQ(layout.value, (CellRect{260, 16, 60, 18}));
    EXPECT_EQ(layout.contentSize.width, 320);
    EXPECT_EQ(layout.contentSize.height, 50);
    EXPECT_EQ(layout.scrollFrame, (CellRect{0, 0, 320, 50}));
    EXPECT_FALSE(layout.scrolls());
}

TEST(CellLayoutTest, APairThatDoesNotFitFollowsTheKeyAndScrollsByBothWidths) {
    // need = 180 + 10 + 50 + 150 = 390 > 320: value x = 0 + 10 + 180 + 50 = 240; content 320 + 180 + 150.
    const KeyValueCellLayout layout = layoutKeyValueCell({0, 0, 320, 50}, {180, 18}, {150, 17}, kPoints);
    EXPECT_EQ(layout.key, (CellRect{10, 16, 180, 18}));
    EXPECT_EQ(layout.value, (CellRect{240, 16, 150, 17}));
    EXPECT_EQ(layout.contentSize.width, 650);
    EXPECT_EQ(layout.scrollFrame, (CellRect{0, 0, 320, 50}));
    EXPECT_TRUE(layout.scrolls());
}

TEST(CellLayoutTest, APairThatExactlyFillsTheRowFollowsTheKeyButDoesNotScroll) {
    // need = 100 + 10 + 50 + 160 = 320, not below w: the value follows the key; not above w: no scrolling.
    const KeyValueCellLayout layout = layoutKeyValueCell({0, 0, 320, 50}, {100, 18}, {160, 18}, kPoints);
    EXPECT_EQ(layout.value.x, 160);
    EXPECT_EQ(layout.contentSize.width, 320);
    EXPECT_FALSE(layout.scrolls());
}

TEST(CellLayoutTest, TheContentOriginOffsetsTheKeyButNotTheFlushValue) {
    // The flush value is placed at w - vw whatever x is; the key and the following value add x.
    const KeyValueCellLayout fits = layoutKeyValueCell({5, 2, 300, 40}, {50, 10}, {40, 10}, kPoints);
    EXPECT_EQ(fits.key, (CellRect{15, 15, 50, 10}));
    EXPECT_EQ(fits.value, (CellRect{260, 15, 40, 10}));
    EXPECT_EQ(fits.scrollFrame, (CellRect{5, 2, 300, 50}));
    const KeyValueCellLayout overflows = layoutKeyValueCell({5, 2, 300, 40}, {200, 10}, {100, 10}, kPoints);
    EXPECT_EQ(overflows.value.x, 5 + 10 + 200 + 50);
}

TEST(CellLayoutTest, TerminalColumnsUseTheSameRules) {
    const CellMetrics columns{1, 2, 1};
    // 80 columns, key 16, value 10: need = 16 + 1 + 2 + 10 = 29 < 80: value at 70.
    const KeyValueCellLayout fits = layoutKeyValueCell({0, 0, 80, 1}, {16, 1}, {10, 1}, columns);
    EXPECT_EQ(fits.key, (CellRect{1, 0, 16, 1}));
    EXPECT_EQ(fits.value, (CellRect{70, 0, 10, 1}));
    // 20 columns: need 29 > 20: value at 1 + 16 + 2 = 19, content 20 + 16 + 10 = 46.
    const KeyValueCellLayout overflows = layoutKeyValueCell({0, 0, 20, 1}, {16, 1}, {10, 1}, columns);
    EXPECT_EQ(overflows.value, (CellRect{19, 0, 10, 1}));
    EXPECT_EQ(overflows.contentSize.width, 46);
}

}  // namespace
}  // namespace velmar
