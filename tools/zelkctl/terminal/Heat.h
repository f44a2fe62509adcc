// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace pemaro::zelkctl {

struct Color {
    uint8_t red;
    uint8_t green;
    uint8_t blue;
};

/// The hottest level that heatLevel() tells.
constexpr uint8_t kHottest = 254;

/// How hot a cell is, from 0 to kHottest, where `full` is as hot as it gets. What is not above 0 is cold.
uint8_t heatLevel(int value, int full);

/// The colour of a level, from black by way of violet, red and orange to pale yellow: each is lighter
/// than the one before, so that they can be told apart without colours as well.
Color heatColor(uint8_t level);

}  // namespace pemaro::zelkctl
