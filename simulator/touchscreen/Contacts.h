// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "frames/Frame.h"

struct libevdev;

namespace pemaro::simulator {

// What an input device of the kernel's tells of the fingers on it, in either of two ways:
//
//   several    slots (ABS_MT_SLOT), each with the contact that it holds (ABS_MT_TRACKING_ID, -1 for
//              none) and its position (ABS_MT_POSITION_X and _Y), pressure and distance
//   one        BTN_TOUCH, with ABS_X, ABS_Y and ABS_PRESSURE
//
// A position is one of a range that the device tells; it becomes one of a frame's.

/// Why the device is no touch screen; empty when it is one.
std::string touchScreenFault(const libevdev* device);

/// How many fingers it tells apart. REQUIRES: it is a touch screen.
uint32_t contactLimit(const libevdev* device);

/// The fingers that are on it now, by their slots. A finger above it is none. REQUIRES: it is a
/// touch screen.
std::vector<frames::FingerRecord> contactsOf(const libevdev* device);

}  // namespace pemaro::simulator
