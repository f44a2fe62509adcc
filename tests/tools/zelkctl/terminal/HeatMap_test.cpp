// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/HeatMap.h"

#include <fmt/core.h>
#include <gtest/gtest.h>

#include "tools/zelkctl/terminal/Heat.h"

namespace pemaro::zelkctl {

namespace {

using Lines = std::vector<std::string>;

frames::FrameContent frame(uint16_t columns, uint16_t rows, std::vector<int16_t> image) {
    frames::FrameContent content{};
    content.header.columns = columns;
    content.header.rows = rows;
    content.image = std::move(image);
    return content;
}

// Two columns and four rows: cold and hot at the top, half and cold, then cold.
frames::FrameContent corner() {
    return frame(2, 4, {0, 1000, 500, 0, 0, 0, 0, 0});
}

HeatMapStyle style(int columns, int rows, Colors colors = Colors::kNone, bool unicode = true) {
    return {columns, rows, colors, unicode, 1000};
}

std::string trueColor(int what, int value) {
    const Color color = heatColor(heatLevel(value, 1000));
    return fmt::format("\x1b[{};2;{};{};{}m", what, color.red, color.green, color.blue);
}

}  // namespace

TEST(HeatMap, IsDenserTheHotterItIsWithoutColours) {
    EXPECT_EQ((Lines{"=@", "  "}), drawHeatMap(corner(), style(2, 2)));
}

TEST(HeatMap, DrawsTwoPixelsInACharacter) {
    const std::string hot = trueColor(38, 1000);
    const std::string cold = trueColor(48, 0);
    const Lines lines = drawHeatMap(corner(), style(2, 2, Colors::kTrue));
    ASSERT_EQ(2u, lines.size());
    EXPECT_EQ(trueColor(48, 500) + trueColor(38, 0) + "▀" + cold + hot + "▀\x1b[0m", lines[0]);
    EXPECT_EQ(cold + "  \x1b[0m", lines[1]);
}

TEST(HeatMap, DrawsTheHotterOneWhereThereAreNoBlocks) {
    EXPECT_EQ((Lines{trueColor(48, 500) + " " + trueColor(48, 1000) + " \x1b[0m",
                     trueColor(48, 0) + "  \x1b[0m"}),
              drawHeatMap(corner(), style(2, 2, Colors::kTrue, false)));
}

TEST(HeatMap, UsesTheColoursOfATerminalThatHas256) {
    // 8, 6, 20 is nearest to black, and 252, 250, 170 to the last but one step of blue.
    EXPECT_EQ((Lines{"\x1b[48;5;16m\x1b[38;5;229m▀\x1b[0m"}),
              drawHeatMap(frame(1, 2, {1000, 0}), style(1, 1, Colors::k256)));
}

TEST(HeatMap, IsAsLargeAsFits) {
    const struct {
        int columns;
        int rows;
        size_t width;
        size_t height;
    } rows[] = {
            {2, 2, 2, 2},   // a pixel for each cell
            {3, 9, 2, 2},   // not half a pixel more
            {4, 9, 4, 4},   // two pixels
            {80, 5, 4, 4},  // the height limits
            {1, 9, 1, 1},   // half a pixel
            {80, 1, 1, 1},
    };
    for (const auto& row : rows) {
        const Lines lines = drawHeatMap(corner(), style(row.columns, row.rows));
        ASSERT_EQ(row.height, lines.size()) << row.columns << " x " << row.rows;
        EXPECT_EQ(row.width, lines[0].size()) << row.columns << " x " << row.rows;
    }
}

TEST(HeatMap, LosesNoPeakWhenItIsSmall) {
    std::vector<int16_t> image(100 * 100);
    image[57 * 100 + 33] = 1000;
    const Lines lines = drawHeatMap(frame(100, 100, image), style(10, 5));
    int hot = 0;
    for (const std::string& line : lines) {
        hot += static_cast<int>(
                line.size() - std::string(line).erase(line.find_last_not_of(' ') + 1).size() <
                line.size());
    }
    EXPECT_EQ(1, hot);
    EXPECT_EQ('@', lines[2][3]);
}

TEST(HeatMap, HasTheFingersInTheirPlaces) {
    frames::FrameContent content = frame(10, 20, std::vector<int16_t>(200));
    content.fingers = {{0, 0, 0, 1}, {13, 65535, 65535, 1}, {2, 32768, 32768, 1}};
    const Lines lines = drawHeatMap(content, style(10, 10));
    EXPECT_EQ((Lines{"0         ", "          ", "          ", "          ", "          ",
                     "     2    ", "          ", "          ", "          ", "         3"}),
              lines);
    EXPECT_NE(std::string::npos,
              drawHeatMap(content, style(10, 10, Colors::kTrue))[5].find("\x1b[1;97;40m2\x1b[0m"));
}

TEST(HeatMap, IsNothingWithoutAnImageOrRoom) {
    EXPECT_TRUE(drawHeatMap(frame(0, 0, {}), style(80, 24)).empty());
    EXPECT_TRUE(drawHeatMap(corner(), style(0, 24)).empty());
    EXPECT_TRUE(drawHeatMap(corner(), style(80, 0)).empty());
}

}  // namespace pemaro::zelkctl
