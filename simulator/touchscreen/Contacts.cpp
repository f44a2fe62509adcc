// SPDX-License-Identifier: Apache-2.0
#include "simulator/touchscreen/Contacts.h"

#include <libevdev/libevdev.h>

#include <algorithm>
#include <cmath>

#include "frames/FrameGenerator.h"

namespace pemaro::simulator {
namespace {

/// The codes of one of the two ways.
struct Axes {
    unsigned int x;
    unsigned int y;
    unsigned int pressure;
    unsigned int distance;
};

constexpr Axes kSeveral{ABS_MT_POSITION_X, ABS_MT_POSITION_Y, ABS_MT_PRESSURE, ABS_MT_DISTANCE};
constexpr Axes kOne{ABS_X, ABS_Y, ABS_PRESSURE, ABS_DISTANCE};

/// The lightest touch is this part of the firmest.
constexpr double kLightest = 0.25;

bool has(const libevdev* device, unsigned int code) {
    return libevdev_has_event_code(device, EV_ABS, code) != 0;
}

bool hasSlots(const libevdev* device) {
    return libevdev_get_num_slots(device) > 0 && has(device, ABS_MT_TRACKING_ID);
}

const Axes& axesOf(const libevdev* device) {
    return hasSlots(device) ? kSeveral : kOne;
}

bool isRange(const libevdev* device, unsigned int code) {
    return has(device, code) &&
           libevdev_get_abs_minimum(device, code) < libevdev_get_abs_maximum(device, code);
}

/// Where a value lies in its range, from 0 to 1.
double partOf(const libevdev* device, unsigned int code, int value) {
    const double least = libevdev_get_abs_minimum(device, code);
    const double most = libevdev_get_abs_maximum(device, code);
    return std::clamp((value - least) / (most - least), 0.0, 1.0);
}

/// A finger, whose values `read` tells by their codes.
template <typename Read>
frames::FingerRecord fingerOf(const libevdev* device, int slot, const Axes& axes, Read read) {
    const auto position = [&](unsigned int code) {
        return static_cast<uint16_t>(
                std::lround(partOf(device, code, read(code)) * frames::kPositionMax));
    };
    double firmness = 1;
    if (isRange(device, axes.pressure)) {
        firmness = kLightest + (1 - kLightest) * partOf(device, axes.pressure, read(axes.pressure));
    }
    return {static_cast<uint16_t>(slot), position(axes.x), position(axes.y),
            static_cast<int16_t>(frames::kFingerPeak * firmness)};
}

template <typename Read>
bool isAbove(const libevdev* device, const Axes& axes, Read read) {
    return has(device, axes.distance) && read(axes.distance) > 0;
}

}  // namespace

std::string touchScreenFault(const libevdev* device) {
    const Axes& axes = axesOf(device);
    if (!isRange(device, axes.x) || !isRange(device, axes.y)) {
        return "it tells no positions";
    }
    if (!hasSlots(device) && libevdev_has_event_code(device, EV_KEY, BTN_TOUCH) == 0) {
        return "it does not tell when it is touched";
    }
    // As a touch pad does, which is no panel.
    return libevdev_has_property(device, INPUT_PROP_POINTER) != 0 ? "it moves a pointer" : "";
}

uint32_t contactLimit(const libevdev* device) {
    return hasSlots(device) ? static_cast<uint32_t>(libevdev_get_num_slots(device)) : 1;
}

std::vector<frames::FingerRecord> contactsOf(const libevdev* device) {
    std::vector<frames::FingerRecord> fingers;
    if (!hasSlots(device)) {
        const auto read = [device](unsigned int code) {
            return libevdev_get_event_value(device, EV_ABS, code);
        };
        if (libevdev_get_event_value(device, EV_KEY, BTN_TOUCH) != 0 &&
            !isAbove(device, kOne, read)) {
            fingers.push_back(fingerOf(device, 0, kOne, read));
        }
        return fingers;
    }
    for (int slot = 0; slot < libevdev_get_num_slots(device); ++slot) {
        const auto read = [device, slot](unsigned int code) {
            return libevdev_get_slot_value(device, static_cast<unsigned int>(slot), code);
        };
        if (read(ABS_MT_TRACKING_ID) >= 0 && !isAbove(device, kSeveral, read)) {
            fingers.push_back(fingerOf(device, slot, kSeveral, read));
        }
    }
    return fingers;
}

}  // namespace pemaro::simulator
