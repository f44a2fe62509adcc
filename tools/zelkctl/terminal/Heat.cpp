// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Heat.h"

#include <algorithm>
#include <iterator>

namespace pemaro::zelkctl {
namespace {

/// Colours at equal distances, between which the others lie.
constexpr Color kColors[] = {{8, 6, 20},    {62, 14, 98},   {128, 30, 108}, {192, 48, 78},
                             {236, 92, 40}, {250, 164, 30}, {252, 250, 170}};

uint8_t between(uint8_t from, uint8_t to, int part, int whole) {
    return static_cast<uint8_t>(from + (to - from) * part / whole);
}

}  // namespace

uint8_t heatLevel(int value, int full) {
    if (value <= 0 || full <= 0) {
        return 0;
    }
    return static_cast<uint8_t>(std::min<int64_t>(int64_t{value} * kHottest / full, kHottest));
}

Color heatColor(uint8_t level) {
    constexpr int kSteps = static_cast<int>(std::size(kColors)) - 1;
    const int position = std::min(level, kHottest) * kSteps;
    const int step = std::min(position / kHottest, kSteps - 1);
    const int part = position - step * kHottest;
    const Color& from = kColors[step];
    const Color& to = kColors[step + 1];
    return {between(from.red, to.red, part, kHottest),
            between(from.green, to.green, part, kHottest),
            between(from.blue, to.blue, part, kHottest)};
}

}  // namespace pemaro::zelkctl
