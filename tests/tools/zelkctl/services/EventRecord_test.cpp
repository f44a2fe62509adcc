// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/EventRecord.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>

using pemaro::simulator::GestureRecord;
using pemaro::simulator::HandEvent;
using pemaro::simulator::HandRecord;

namespace pemaro::zelkctl {

namespace {

std::unique_ptr<GestureRecord> circle(int gesture = 5, int feature = 2, uint32_t flags = 0) {
    auto record = std::make_unique<GestureRecord>();
    record->sequence = 17;
    record->gesture = gesture;
    record->feature = feature;
    record->flags = flags;
    record->pointCount = 3;
    record->points[0] = {0, 540, 500, 100, 0};
    record->points[1] = {400, 700, 900, 100, 0};
    record->points[2] = {812, 560, 510, 100, 0};
    simulator::sealGestureRecord(record.get());
    return record;
}

HandRecord hand(HandEvent event) {
    HandRecord record{};
    record.sequence = 3;
    record.event = event;
    record.progress = 40;
    record.score = 97;
    record.security = 2;
    strcpy(record.profile, "Anna\n");
    simulator::sealHandRecord(&record);
    return record;
}

template <typename Record>
EventRecord read(const Record& record) {
    return EventRecord::read(&record, sizeof(record));
}

EventFilter only(std::optional<int> gesture, std::optional<int> feature,
                 std::optional<HandEvent> event) {
    return {gesture, feature, event};
}

}  // namespace

TEST(EventRecord, OfAGestureInWords) {
    using namespace simulator;
    const struct {
        int gesture;
        int feature;
        uint32_t flags;
        const char* words;
    } rows[] = {
            {5, 2, 0, "#17  circle (gesture 5, feature 2)  540, 500 to 560, 510 in 812 ms"},
            {1, 0, kGestureWakeup,
             "#17  swipe right (gesture 1)  540, 500 to 560, 510 in 812 ms  woke the device"},
            {9, 0, kGestureRegionOn,
             "#17  a gesture of the user's (gesture 9)  540, 500 to 560, 510 in 812 ms  outside "
             "the "
             "region"},
            {8, 4, kGestureWakeup | kGestureRegionOn | kGestureInsideRegion,
             "#17  square (gesture 8, feature 4)  540, 500 to 560, 510 in 812 ms  woke the device  "
             "inside the region"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.words, read(*circle(row.gesture, row.feature, row.flags)).words());
    }
    auto empty = circle();
    empty->pointCount = 0;
    simulator::sealGestureRecord(empty.get());
    EXPECT_EQ("#17  circle (gesture 5, feature 2)  nothing drawn", read(*empty).words());
}

TEST(EventRecord, OfAHandInWords) {
    const struct {
        HandEvent event;
        const char* words;
    } rows[] = {
            {HandEvent::kEnrollmentStarted, "#3  enrollment started"},
            {HandEvent::kEnrollmentProgress, "#3  enrollment progress, 40 %"},
            {HandEvent::kEnrollmentDone, "#3  enrollment done as Anna?"},
            {HandEvent::kEnrollmentStopped, "#3  enrollment stopped"},
            {HandEvent::kScanStarted, "#3  scan started"},
            {HandEvent::kScanDone, "#3  scan done"},
            {HandEvent::kMatchingStarted, "#3  matching started"},
            {HandEvent::kHandDetected, "#3  hand detected"},
            {HandEvent::kMatched, "#3  matched Anna?, score 97 at security level 2"},
            {HandEvent::kNotMatched, "#3  not matched, score 97 at security level 2"},
            {HandEvent::kMatchingStopped, "#3  matching stopped"},
            {HandEvent::kCancelled, "#3  cancelled"},
            {HandEvent::kWakeup, "#3  wake-up"},
            {static_cast<HandEvent>(14), "#3  event 14"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.words, read(hand(row.event)).words());
    }
}

TEST(EventRecord, OfAGestureInJson) {
    const auto record = circle();
    const std::string start =
            "{\"kind\":\"gesture\",\"sequence\":17,\"device_time_ns\":" +
            std::to_string(record->timeNs) +
            ",\"gesture\":5,\"name\":\"circle\",\"feature\":2,\"wakeup\":false,\"region\":false,"
            "\"inside\":false,\"points\":3";
    JsonObject plain;
    read(*record).describe(plain, false);
    EXPECT_EQ(start + "}", plain.text());
    JsonObject withStroke;
    read(*record).describe(withStroke, true);
    EXPECT_EQ(start + ",\"stroke\":[{\"ms\":0,\"x\":540,\"y\":500,\"pressure\":100,\"finger\":0},"
                      "{\"ms\":400,\"x\":700,\"y\":900,\"pressure\":100,\"finger\":0},"
                      "{\"ms\":812,\"x\":560,\"y\":510,\"pressure\":100,\"finger\":0}]}",
              withStroke.text());
}

TEST(EventRecord, OfAHandInJson) {
    const HandRecord record = hand(HandEvent::kMatched);
    JsonObject object;
    read(record).describe(object, true);
    EXPECT_EQ(
            "{\"kind\":\"hand\",\"sequence\":3,\"device_time_ns\":" +
                    std::to_string(record.timeNs) +
                    ",\"event\":9,\"name\":\"matched\",\"progress\":40,\"score\":97,\"security\":2,"
                    "\"profile\":\"Anna\\n\"}",
            object.text());
}

TEST(EventRecord, IsUnknownWhenItIsNotIntact) {
    auto torn = circle();
    torn->points[1].x ^= 1;
    EXPECT_FALSE(read(*torn).isKnown());
    EXPECT_FALSE(EventRecord::read(circle().get(), 9).isKnown());
    EXPECT_FALSE(EventRecord::read(nullptr, sizeof(GestureRecord)).isKnown());
    EXPECT_TRUE(read(*circle()).isKnown());
    JsonObject object;
    read(*torn).describe(object, true);
    EXPECT_EQ("{}", object.text());
    EXPECT_TRUE(read(*torn).drawing(true).empty());
}

TEST(EventRecord, PassesTheFiltersThatItMeets) {
    const EventRecord gesture = read(*circle());
    const EventRecord matched = read(hand(HandEvent::kMatched));
    const EventRecord unknown = EventRecord::read("123456789", 9);
    const struct {
        EventFilter filter;
        bool gesture;
        bool matched;
        bool unknown;
    } rows[] = {
            {only({}, {}, {}), true, true, true},
            {only(5, {}, {}), true, false, false},
            {only(6, {}, {}), false, false, false},
            {only({}, 2, {}), true, false, false},
            {only(5, 3, {}), false, false, false},
            {only(5, 2, {}), true, false, false},
            {only({}, {}, HandEvent::kMatched), false, true, false},
            {only({}, {}, HandEvent::kNotMatched), false, false, false},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.gesture, gesture.passes(row.filter));
        EXPECT_EQ(row.matched, matched.passes(row.filter));
        EXPECT_EQ(row.unknown, unknown.passes(row.filter));
    }
}

TEST(EventRecord, HasADrawingOfAStroke) {
    const std::vector<std::string> lines = read(*circle()).drawing(false);
    ASSERT_EQ(22u, lines.size());
    EXPECT_EQ("+------------------+", lines[0]);
    EXPECT_EQ("|         O        |", lines[5]);
    EXPECT_TRUE(read(hand(HandEvent::kMatched)).drawing(false).empty());
}

TEST(EventNames, AreReadAsTheyAreWritten) {
    EXPECT_EQ(1, gestureOf("swipe-right"));
    EXPECT_EQ(6, gestureOf("V"));
    EXPECT_EQ(7, gestureOf("z"));
    EXPECT_EQ(8, gestureOf("8"));
    EXPECT_EQ(12, gestureOf("12"));
    for (const char* text : {"", "spiral", "0", "-1", "5x", "99999999999"}) {
        EXPECT_FALSE(gestureOf(text)) << text;
    }
    EXPECT_EQ(HandEvent::kEnrollmentStarted, handEventOf("enrollment-started"));
    EXPECT_EQ(HandEvent::kWakeup, handEventOf("wake-up"));
    EXPECT_EQ(HandEvent::kMatched, handEventOf("9"));
    for (const char* text : {"", "hand", "0", "14", "matched "}) {
        EXPECT_FALSE(handEventOf(text)) << text;
    }
}

}  // namespace pemaro::zelkctl
