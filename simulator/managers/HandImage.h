// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace pemaro::simulator {

constexpr size_t kHandColumns = 80;
constexpr size_t kHandRows = 124;

/// What the panel sees of a hand: the pattern of its veins, row by row, around 128.
using HandImage = std::array<uint8_t, kHandColumns * kHandRows>;

/// What is not the hand when it is laid on the panel with care, and carelessly.
constexpr double kCarefulNoise = 0.05;
constexpr double kCarelessNoise = 0.43;

/// The hand of a person, laid on the panel so that about `noise` (0 to 1) of what is seen
/// is not the hand. Each variation is another time.
HandImage seeHand(uint32_t person, double noise, uint32_t variation);

/// How alike two images are, from 0 to 100: their correlation, where it is positive.
double handSimilarity(const HandImage& a, const HandImage& b);

}  // namespace pemaro::simulator
