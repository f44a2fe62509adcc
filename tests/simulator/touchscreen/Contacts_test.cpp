// SPDX-License-Identifier: Apache-2.0
#include "simulator/touchscreen/Contacts.h"

#include <gtest/gtest.h>
#include <libevdev/libevdev.h>

#include <string>
#include <tuple>
#include <vector>

#include "tests/support/DescribedDevice.h"

namespace pemaro::simulator {

namespace {

using test::DescribedDevice;
using test::Event;
using test::Range;

using Finger = std::tuple<int, int, int, int>;  // number, x, y, peak

std::vector<Finger> fingersOf(const DescribedDevice& device) {
    std::vector<Finger> fingers;
    for (const frames::FingerRecord& finger : contactsOf(device.get())) {
        fingers.emplace_back(finger.id, finger.x, finger.y, finger.peak);
    }
    return fingers;
}

const std::vector<Range> kSeveralAxes = {
        {ABS_MT_SLOT, 0, 4},          {ABS_MT_TRACKING_ID, 0, 65535},
        {ABS_MT_POSITION_X, 0, 1000}, {ABS_MT_POSITION_Y, -500, 1500},
        {ABS_MT_PRESSURE, 0, 255},    {ABS_MT_DISTANCE, 0, 10}};
const std::vector<Range> kOneAxis = {{ABS_X, 100, 4000}, {ABS_Y, 100, 4000}};

}  // namespace

// Each row goes on from where the one before it ended.
TEST(Contacts, OfSeveralFollowTheSlots) {
    DescribedDevice device(kSeveralAxes);
    ASSERT_EQ("", touchScreenFault(device.get()));
    EXPECT_EQ(5u, contactLimit(device.get()));
    const struct {
        const char* what;
        std::vector<Event> events;
        std::vector<Finger> fingers;
    } rows[] = {
            {"nobody", {}, {}},
            {"a finger in the upper left corner, which presses firmly",
             {{EV_ABS, ABS_MT_SLOT, 0},
              {EV_ABS, ABS_MT_TRACKING_ID, 17},
              {EV_ABS, ABS_MT_POSITION_X, 0},
              {EV_ABS, ABS_MT_POSITION_Y, -500},
              {EV_ABS, ABS_MT_PRESSURE, 255}},
             {{0, 0, 0, 1200}}},
            {"another in a slot farther on, lightly in the lower right one",
             {{EV_ABS, ABS_MT_SLOT, 3},
              {EV_ABS, ABS_MT_TRACKING_ID, 18},
              {EV_ABS, ABS_MT_POSITION_X, 1000},
              {EV_ABS, ABS_MT_POSITION_Y, 1500},
              {EV_ABS, ABS_MT_PRESSURE, 0}},
             {{0, 0, 0, 1200}, {3, 65535, 65535, 300}}},
            {"it moves along one axis, to the middle",
             {{EV_ABS, ABS_MT_POSITION_X, 500}},
             {{0, 0, 0, 1200}, {3, 32768, 65535, 300}}},
            {"beyond its range",
             {{EV_ABS, ABS_MT_POSITION_X, 2000}, {EV_ABS, ABS_MT_PRESSURE, 300}},
             {{0, 0, 0, 1200}, {3, 65535, 65535, 1200}}},
            {"the first is lifted",
             {{EV_ABS, ABS_MT_SLOT, 0}, {EV_ABS, ABS_MT_TRACKING_ID, -1}},
             {{3, 65535, 65535, 1200}}},
            {"and comes back above the panel",
             {{EV_ABS, ABS_MT_TRACKING_ID, 19}, {EV_ABS, ABS_MT_DISTANCE, 4}},
             {{3, 65535, 65535, 1200}}},
            {"which it touches, where it was",
             {{EV_ABS, ABS_MT_DISTANCE, 0}},
             {{0, 0, 0, 1200}, {3, 65535, 65535, 1200}}},
            {"all are lifted",
             {{EV_ABS, ABS_MT_TRACKING_ID, -1},
              {EV_ABS, ABS_MT_SLOT, 3},
              {EV_ABS, ABS_MT_TRACKING_ID, -1}},
             {}},
    };
    for (const auto& row : rows) {
        device.take(row.events);
        EXPECT_EQ(row.fingers, fingersOf(device)) << row.what;
    }
}

TEST(Contacts, OfOneFollowTheTouch) {
    DescribedDevice device(kOneAxis, {BTN_TOUCH});
    ASSERT_EQ("", touchScreenFault(device.get()));
    EXPECT_EQ(1u, contactLimit(device.get()));
    const struct {
        std::vector<Event> events;
        std::vector<Finger> fingers;
    } rows[] = {
            {{}, {}},
            {{{EV_ABS, ABS_X, 100}, {EV_ABS, ABS_Y, 4000}}, {}},
            {{{EV_KEY, BTN_TOUCH, 1}}, {{0, 0, 65535, 1200}}},
            {{{EV_ABS, ABS_X, 2050}}, {{0, 32768, 65535, 1200}}},
            {{{EV_KEY, BTN_TOUCH, 0}}, {}},
    };
    for (const auto& row : rows) {
        device.take(row.events);
        EXPECT_EQ(row.fingers, fingersOf(device));
    }
}

TEST(Contacts, AreThoseOfTouchScreensAlone) {
    const std::vector<Range> noRange = {{ABS_X, 0, 0}, {ABS_Y, 0, 100}};
    const std::vector<Range> noSlots = {{ABS_MT_POSITION_X, 0, 100}, {ABS_MT_POSITION_Y, 0, 100}};
    const struct {
        DescribedDevice device;
        const char* fault;
    } rows[] = {
            {{{}, {KEY_A, KEY_B}}, "it tells no positions"},
            {{noRange, {BTN_TOUCH}}, "it tells no positions"},
            {{{{ABS_X, 0, 100}}, {BTN_TOUCH}}, "it tells no positions"},
            {{noSlots, {BTN_TOUCH}}, "it tells no positions"},
            // A joystick.
            {{kOneAxis, {BTN_TRIGGER}}, "it does not tell when it is touched"},
            {DescribedDevice(kSeveralAxes).with(INPUT_PROP_POINTER), "it moves a pointer"},
            {DescribedDevice(kSeveralAxes).with(INPUT_PROP_DIRECT), ""},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.fault, touchScreenFault(row.device.get()));
    }
}

}  // namespace pemaro::simulator
