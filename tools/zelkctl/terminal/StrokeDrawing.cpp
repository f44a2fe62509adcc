// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/StrokeDrawing.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <map>

namespace pemaro::zelkctl {
namespace {

/// Dots of a character of the Braille block, across and down.
constexpr int kDotsAcross = 2;
constexpr int kDotsDown = 4;
/// The bit of each dot in the character's number, which counts from U+2800.
constexpr uint8_t kDotBits[kDotsDown][kDotsAcross] = {{1, 8}, {2, 16}, {4, 32}, {64, 128}};

std::string braille(uint8_t dots) {
    const char text[] = {'\xE2', static_cast<char>(0xA0 + (dots >> 6)),
                         static_cast<char>(0x80 + (dots & 0x3F))};
    return {text, sizeof(text)};
}

class Sheet {
  public:
    explicit Sheet(const StrokeStyle& style)
            : mStyle(style),
              mAcross(style.columns * (style.unicode ? kDotsAcross : 1)),
              mDown(style.rows * (style.unicode ? kDotsDown : 1)),
              mDots(static_cast<size_t>(style.columns * style.rows)),
              mStarts(mDots.size()) {}

    void begin(const StrokePoint& point) { mStarts[indexOf(across(point), down(point))] = true; }

    /// A straight line.
    void draw(const StrokePoint& from, const StrokePoint& to) {
        const int x = across(from);
        const int y = down(from);
        const int dx = across(to) - x;
        const int dy = down(to) - y;
        const int steps = std::max({std::abs(dx), std::abs(dy), 1});
        for (int i = 0; i <= steps; ++i) {
            set(x + rounded(dx * i, steps), y + rounded(dy * i, steps));
        }
    }

    std::vector<std::string> lines() const {
        const auto columns = static_cast<size_t>(mStyle.columns);
        std::vector<std::string> lines = {edge("\xE2\x94\x8C", "\xE2\x94\x90")};
        for (size_t row = 0; row < static_cast<size_t>(mStyle.rows); ++row) {
            std::string line;
            for (size_t cell = row * columns; cell < (row + 1) * columns; ++cell) {
                line += character(cell);
            }
            lines.push_back(side() + line + side());
        }
        lines.push_back(edge("\xE2\x94\x94", "\xE2\x94\x98"));
        return lines;
    }

  private:
    static int place(int position, int size, int dots) {
        return std::clamp(static_cast<int>(int64_t{position} * dots / size), 0, dots - 1);
    }
    static int rounded(int dividend, int divisor) {
        return (2 * dividend + (dividend < 0 ? -divisor : divisor)) / (2 * divisor);
    }
    int across(const StrokePoint& point) const { return place(point.x, mStyle.width, mAcross); }
    int down(const StrokePoint& point) const { return place(point.y, mStyle.height, mDown); }

    size_t indexOf(int x, int y) const {
        const int row = y * mStyle.rows / mDown;
        const int column = x * mStyle.columns / mAcross;
        return static_cast<size_t>(row) * static_cast<size_t>(mStyle.columns) +
               static_cast<size_t>(column);
    }

    void set(int x, int y) { mDots[indexOf(x, y)] |= kDotBits[y % kDotsDown][x % kDotsAcross]; }

    std::string character(size_t cell) const {
        if (mStarts[cell]) {
            return "O";
        }
        if (mDots[cell] == 0) {
            return " ";
        }
        return mStyle.unicode ? braille(mDots[cell]) : "*";
    }

    std::string side() const { return mStyle.unicode ? "\xE2\x94\x82" : "|"; }

    std::string edge(const char* left, const char* right) const {
        std::string line;
        for (int i = 0; i < mStyle.columns; ++i) {
            line += mStyle.unicode ? "\xE2\x94\x80" : "-";
        }
        return mStyle.unicode ? left + line + right : "+" + line + "+";
    }

    const StrokeStyle& mStyle;
    const int mAcross;
    const int mDown;
    std::vector<uint8_t> mDots;
    std::vector<bool> mStarts;
};

}  // namespace

std::vector<std::string> drawStroke(const std::vector<StrokePoint>& points,
                                    const StrokeStyle& style) {
    Sheet sheet(style);
    std::map<int, StrokePoint> last;
    for (const StrokePoint& point : points) {
        const auto before = last.find(point.finger);
        if (before == last.end()) {
            sheet.begin(point);
        } else {
            sheet.draw(before->second, point);
        }
        last[point.finger] = point;
    }
    return sheet.lines();
}

}  // namespace pemaro::zelkctl
