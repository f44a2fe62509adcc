// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <vector>

#include "simulator/managers/GestureRecord.h"

namespace pemaro::simulator {

/// What a finger draws: points in order of time.
///
/// The panel knows eight shapes by itself, numbered from 1: swipes to the right, left, up and down,
/// a circle, a V, a Z and a square.
using Stroke = std::vector<GesturePoint>;

constexpr int kShapes = 8;

/// A shape as a hand would draw it; each variation has another place, size and unsteadiness.
/// REQUIRES: 1 <= shape <= kShapes.
Stroke drawShape(int shape, uint32_t variation);

/// The same stroke drawn once more.
Stroke drawAgain(const Stroke& stroke, uint32_t variation);

Stroke strokeOf(const GestureRecord& record);
/// Points that do not fit are left out.
void setStroke(const Stroke& stroke, GestureRecord* record);

/// Whether there is anything to compare: points, not all of them in one place.
bool isDrawn(const Stroke& stroke);

/// How alike two strokes are, from 0 to 100, wherever and however large they were drawn. Both are
/// taken as 64 points at equal distances along the way, moved to a common centre and scaled to a
/// common size; the mean distance between points of the same number, measured in that size, counts
/// from 0 (100) to a quarter (0). REQUIRES: both are drawn.
double strokeSimilarity(const Stroke& a, const Stroke& b);

}  // namespace pemaro::simulator
