// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Heat.h"

#include <gtest/gtest.h>

namespace pemaro::zelkctl {

namespace {

int lightness(Color color) {
    return 299 * color.red + 587 * color.green + 114 * color.blue;
}

}  // namespace

TEST(Heat, GoesFromNothingToTheHottestCell) {
    const struct {
        int value;
        int full;
        int level;
    } rows[] = {
            {0, 1000, 0},     {-5, 1000, 0},        {-32768, 1, 0},         {5, 0, 0},
            {1, 1000, 0},     {500, 1000, 127},     {1000, 1000, kHottest}, {1001, 1000, kHottest},
            {1, 1, kHottest}, {32767, 1, kHottest},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.level, heatLevel(row.value, row.full)) << row.value << " of " << row.full;
    }
}

TEST(Heat, IsLighterTheHotterItIs) {
    for (int level = 1; level <= kHottest; ++level) {
        EXPECT_GE(lightness(heatColor(static_cast<uint8_t>(level))),
                  lightness(heatColor(static_cast<uint8_t>(level - 1))))
                << level;
    }
    EXPECT_LT(lightness(heatColor(0)), 12000);
    EXPECT_GT(lightness(heatColor(kHottest)), 220000);
}

}  // namespace pemaro::zelkctl
