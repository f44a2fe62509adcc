// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/StrokeDrawing.h"

#include <gtest/gtest.h>

namespace pemaro::zelkctl {

namespace {

using Lines = std::vector<std::string>;

StrokeStyle style(bool unicode) {
    StrokeStyle style;
    style.width = 60;
    style.height = 80;
    style.columns = 6;
    style.rows = 4;
    style.unicode = unicode;
    return style;
}

}  // namespace

TEST(StrokeDrawing, JoinsThePointsOfAFinger) {
    // Across the top, then down to the left.
    EXPECT_EQ((Lines{"+------+",  //
                     "|O*****|",  //
                     "|   ** |",  //
                     "| **   |",  //
                     "|*     |",  //
                     "+------+"}),
              drawStroke({{0, 0, 0}, {59, 0, 0}, {0, 79, 0}}, style(false)));
}

TEST(StrokeDrawing, KeepsFingersApart) {
    EXPECT_EQ((Lines{"+------+",  //
                     "|O    O|",  //
                     "|*    *|",  //
                     "|*    *|",  //
                     "|*    *|",  //
                     "+------+"}),
              drawStroke({{0, 0, 0}, {59, 0, 1}, {0, 79, 0}, {59, 79, 1}}, style(false)));
}

TEST(StrokeDrawing, HasEightDotsInACharacterOfUnicode) {
    // Down the left edge: dots 1, 2, 3 and 7 of each character but the first, where the finger began.
    EXPECT_EQ((Lines{"┌──────┐",  //
                     "│O     │",  //
                     "│⡇     │",  //
                     "│⡇     │",  //
                     "│⡇     │",  //
                     "└──────┘"}),
              drawStroke({{0, 0, 0}, {0, 79, 0}}, style(true)));
    EXPECT_EQ("│⠤⠤⠤⠤⠤O│", drawStroke({{59, 10, 0}, {0, 10, 0}}, style(true))[1]);
}

TEST(StrokeDrawing, KeepsWithinThePanel) {
    EXPECT_EQ((Lines{"+------+",  //
                     "|O     |",  //
                     "|      |",  //
                     "|      |",  //
                     "|     O|",  //
                     "+------+"}),
              drawStroke({{-5, -5, 0}, {65535, 65535, 1}}, style(false)));
}

TEST(StrokeDrawing, OfNothingIsAFrame) {
    EXPECT_EQ("|      |", drawStroke({}, style(false))[2]);
}

}  // namespace pemaro::zelkctl
