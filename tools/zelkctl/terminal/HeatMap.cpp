// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/HeatMap.h"

#include <fmt/core.h>

#include <algorithm>
#include <cstdint>

#include "tools/zelkctl/terminal/Heat.h"

namespace pemaro::zelkctl {
namespace {

constexpr int kPositionMax = 65535;
constexpr const char* kUpperHalf = "\xE2\x96\x80";
constexpr char kDensities[] = " .:-=+*#%@";
constexpr int kDensityCount = sizeof(kDensities) - 1;
constexpr const char* kReset = "\x1b[0m";
constexpr const char* kFingerColors = "\x1b[1;97;40m";

/// The image in pixels of the terminal.
struct Pixels {
    int width = 0;
    int height = 0;
    std::vector<uint8_t> levels;

    /// Below the last one it is cold.
    uint8_t at(int x, int y) const {
        return y < height ? levels[static_cast<size_t>(y) * static_cast<size_t>(width) +
                                   static_cast<size_t>(x)]
                          : 0;
    }
};

/// How many pixels so many cells take, where `room` pixels for `cells` cells is what limits.
int pixelsOf(int count, int room, int cells) {
    const int whole = room / cells;
    return whole > 0 ? count * whole : std::max(1, count * room / cells);
}

uint8_t hottest(const frames::FrameContent& frame, int full, int left, int right, int top,
                int bottom) {
    const size_t columns = frame.header.columns;
    int value = INT16_MIN;
    for (int row = top; row < bottom; ++row) {
        const size_t first = static_cast<size_t>(row) * columns;
        for (int column = left; column < right; ++column) {
            value = std::max<int>(value, frame.image[first + static_cast<size_t>(column)]);
        }
    }
    return heatLevel(value, full);
}

Pixels scale(const frames::FrameContent& frame, const HeatMapStyle& style) {
    const int columns = frame.header.columns;
    const int rows = frame.header.rows;
    const int roomAcross = style.columns;
    const int roomDown = 2 * style.rows;
    const bool acrossLimits = int64_t{roomAcross} * rows <= int64_t{roomDown} * columns;
    const int room = acrossLimits ? roomAcross : roomDown;
    const int cells = acrossLimits ? columns : rows;
    Pixels pixels;
    pixels.width = pixelsOf(columns, room, cells);
    pixels.height = pixelsOf(rows, room, cells);
    for (int y = 0; y < pixels.height; ++y) {
        const int top = y * rows / pixels.height;
        const int bottom = std::max(top + 1, (y + 1) * rows / pixels.height);
        for (int x = 0; x < pixels.width; ++x) {
            const int left = x * columns / pixels.width;
            const int right = std::max(left + 1, (x + 1) * columns / pixels.width);
            pixels.levels.push_back(hottest(frame, style.full, left, right, top, bottom));
        }
    }
    return pixels;
}

/// One of the 216 colours of a terminal that has 256.
int colorNumber(const Color& color) {
    const auto step = [](uint8_t part) {
        return part < 48 ? 0 : part < 115 ? 1 : (part - 35) / 40;
    };
    return 16 + 36 * step(color.red) + 6 * step(color.green) + step(color.blue);
}

/// Selects a colour for what is drawn (38) or what it is drawn on (48).
std::string select(int what, uint8_t level, Colors colors) {
    const Color color = heatColor(level);
    return colors == Colors::kTrue
                   ? fmt::format("\x1b[{};2;{};{};{}m", what, color.red, color.green, color.blue)
                   : fmt::format("\x1b[{};5;{}m", what, colorNumber(color));
}

/// A line in the making, which selects colours no more often than they change.
class Line {
  public:
    explicit Line(const HeatMapStyle& style) : mStyle(style) {}

    void addPixels(uint8_t upper, uint8_t lower) {
        if (mStyle.colors == Colors::kNone) {
            const int level = std::max(upper, lower);
            mText += kDensities[level * (kDensityCount - 1) / kHottest];
            return;
        }
        if (!mStyle.unicode) {
            upper = lower = std::max(upper, lower);
        }
        if (lower != mBack) {
            mText += select(48, lower, mStyle.colors);
            mBack = lower;
        }
        if (upper == lower) {
            mText += ' ';
            return;
        }
        if (upper != mFront) {
            mText += select(38, upper, mStyle.colors);
            mFront = upper;
        }
        mText += kUpperHalf;
    }

    void addFinger(int number) {
        const char digit = static_cast<char>('0' + number % 10);
        if (mStyle.colors == Colors::kNone) {
            mText += digit;
            return;
        }
        mText += std::string(kFingerColors) + digit + kReset;
        mFront = mBack = -1;
    }

    std::string text() const { return mStyle.colors == Colors::kNone ? mText : mText + kReset; }

  private:
    const HeatMapStyle& mStyle;
    std::string mText;
    int mFront = -1;
    int mBack = -1;
};

struct Mark {
    int x;
    int line;
    int number;
};

std::vector<Mark> marksOf(const frames::FrameContent& frame, const Pixels& pixels) {
    // A position goes from the middle of the first cell to the middle of the last.
    const auto place = [](int position, int cells, int size) {
        return static_cast<int>((int64_t{position} * (cells - 1) * 2 + kPositionMax) * size /
                                (int64_t{2} * kPositionMax * cells));
    };
    std::vector<Mark> marks;
    for (const frames::FingerRecord& finger : frame.fingers) {
        marks.push_back({place(finger.x, frame.header.columns, pixels.width),
                         place(finger.y, frame.header.rows, pixels.height) / 2, finger.id});
    }
    return marks;
}

}  // namespace

std::vector<std::string> drawHeatMap(const frames::FrameContent& frame, const HeatMapStyle& style) {
    if (frame.image.empty() || style.columns < 1 || style.rows < 1) {
        return {};
    }
    const Pixels pixels = scale(frame, style);
    const std::vector<Mark> marks = marksOf(frame, pixels);
    std::vector<std::string> lines;
    for (int y = 0; y < pixels.height; y += 2) {
        Line line(style);
        for (int x = 0; x < pixels.width; ++x) {
            const auto mark =
                    std::find_if(marks.begin(), marks.end(), [x, y](const Mark& candidate) {
                        return candidate.x == x && candidate.line == y / 2;
                    });
            if (mark != marks.end()) {
                line.addFinger(mark->number);
            } else {
                line.addPixels(pixels.at(x, y), pixels.at(x, y + 1));
            }
        }
        lines.push_back(line.text());
    }
    return lines;
}

}  // namespace pemaro::zelkctl
