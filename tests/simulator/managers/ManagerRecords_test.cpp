// SPDX-License-Identifier: Apache-2.0
// The records of the managers, and what is drawn and seen in them.

#include <gtest/gtest.h>

#include <cstring>
#include <memory>

#include "pemaro/IGestureManagerClient.h"
#include "pemaro/IHandBiometricManagerClient.h"
#include "pemaro/ITouchManagerClient.h"
#include "simulator/Panel.h"
#include "simulator/managers/GestureRecord.h"
#include "simulator/managers/HandImage.h"
#include "simulator/managers/HandRecord.h"
#include "simulator/managers/Stroke.h"

namespace pemaro::simulator {

namespace {

constexpr uint32_t kVariations = 40;
constexpr double kSimilarEnough = 85;

std::unique_ptr<GestureRecord> gesture(int shape) {
    auto record = std::make_unique<GestureRecord>();
    setStroke(drawShape(shape, 1), record.get());
    record->gesture = shape;
    sealGestureRecord(record.get());
    return record;
}

}  // namespace

TEST(GestureRecord, HasTheSizeThatCrossesBinder) {
    EXPECT_EQ(sizeof(ITouchManagerClient::GestureData), sizeof(GestureRecord));
    EXPECT_EQ(sizeof(IGestureManagerClient::GestureData), sizeof(GestureRecord));
    EXPECT_EQ(0, memcmp("ZTGR", gesture(1).get(), 4));
}

TEST(GestureRecord, ReadsBackWhatWasSealed) {
    const auto record = gesture(7);
    const auto copy = readGestureRecord(record.get());
    ASSERT_NE(nullptr, copy);
    EXPECT_EQ(0, memcmp(copy.get(), record.get(), sizeof(*record)));
    EXPECT_EQ(60u, strokeOf(*copy).size());
}

TEST(GestureRecord, RefusesAChangedByteAnywhere) {
    const auto record = gesture(7);
    auto* bytes = reinterpret_cast<uint8_t*>(record.get());
    for (size_t i = 0; i < sizeof(*record); i += i < 64 ? 1 : 997) {
        bytes[i] ^= 1;
        EXPECT_EQ(nullptr, readGestureRecord(bytes)) << "byte " << i;
        bytes[i] ^= 1;
    }
    EXPECT_NE(nullptr, readGestureRecord(bytes));
}

TEST(GestureRecord, RefusesMorePointsThanItHolds) {
    const auto record = gesture(7);
    record->pointCount = kGestureMaxPoints + 1;
    sealGestureRecord(record.get());
    EXPECT_EQ(nullptr, readGestureRecord(record.get()));
}

TEST(GestureRecord, LeavesOutPointsThatDoNotFit) {
    auto record = std::make_unique<GestureRecord>();
    setStroke(Stroke(kGestureMaxPoints + 5, GesturePoint{}), record.get());
    EXPECT_EQ(kGestureMaxPoints, record->pointCount);
}

TEST(Stroke, EachShapeResemblesItselfHoweverItIsDrawn) {
    for (int shape = 1; shape <= kShapes; ++shape) {
        for (uint32_t variation = 1; variation < kVariations; ++variation) {
            EXPECT_LE(kSimilarEnough,
                      strokeSimilarity(drawShape(shape, 0), drawShape(shape, variation)))
                    << "shape " << shape << ", variation " << variation;
        }
    }
}

TEST(Stroke, NoShapeResemblesAnother) {
    for (int a = 1; a <= kShapes; ++a) {
        for (int b = 1; b <= kShapes; ++b) {
            if (a != b) {
                EXPECT_GT(kSimilarEnough, strokeSimilarity(drawShape(a, 3), drawShape(b, 4)))
                        << a << " and " << b;
            }
        }
    }
}

TEST(Stroke, StaysOnThePanel) {
    for (uint32_t variation = 0; variation < kVariations; ++variation) {
        for (const GesturePoint& point : drawShape(8, variation)) {
            EXPECT_GT(kPanelWidth, point.x);
            EXPECT_GT(kPanelHeight, point.y);
        }
    }
}

TEST(Stroke, DrawnAgainResemblesItself) {
    const Stroke stroke = drawShape(6, 1);
    EXPECT_LE(kSimilarEnough, strokeSimilarity(stroke, drawAgain(stroke, 17)));
}

TEST(Stroke, IsNotDrawnWithoutTwoPlaces) {
    EXPECT_FALSE(isDrawn({}));
    EXPECT_FALSE(isDrawn({GesturePoint{0, 5, 5, 0, 0}}));
    EXPECT_FALSE(isDrawn({GesturePoint{0, 5, 5, 0, 0}, GesturePoint{1, 5, 5, 0, 0}}));
    EXPECT_TRUE(isDrawn({GesturePoint{0, 5, 5, 0, 0}, GesturePoint{1, 6, 5, 0, 0}}));
}

TEST(Stroke, ComparesStrokesOfTwoPoints) {
    const Stroke right = {GesturePoint{0, 5, 5, 0, 0}, GesturePoint{1, 90, 5, 0, 0}};
    const Stroke left = {right[1], right[0]};
    EXPECT_EQ(100, strokeSimilarity(right, right));
    EXPECT_EQ(0, strokeSimilarity(right, left));
}

TEST(HandRecord, HasTheSizeThatCrossesBinder) {
    EXPECT_EQ(sizeof(IHandBiometricManagerClient::HandBioData), sizeof(HandRecord));
}

TEST(HandRecord, ReadsBackWhatWasSealedAndNothingElse) {
    auto record = std::make_unique<HandRecord>();
    record->event = HandEvent::kMatched;
    record->image = seeHand(1, kCarefulNoise, 1);
    strcpy(record->profile, "Anna");
    sealHandRecord(record.get());
    EXPECT_EQ(0, memcmp("ZTHR", record.get(), 4));
    const auto copy = readHandRecord(record.get());
    ASSERT_NE(nullptr, copy);
    EXPECT_EQ(0, memcmp(copy.get(), record.get(), sizeof(*record)));

    auto* bytes = reinterpret_cast<uint8_t*>(record.get());
    for (size_t i = 0; i < sizeof(*record); i += i < 112 ? 1 : 97) {
        bytes[i] ^= 1;
        EXPECT_EQ(nullptr, readHandRecord(bytes)) << "byte " << i;
        bytes[i] ^= 1;
    }
}

TEST(HandRecord, RefusesANameWithoutAnEnd) {
    auto record = std::make_unique<HandRecord>();
    memset(record->profile, 'x', sizeof(record->profile));
    sealHandRecord(record.get());
    EXPECT_EQ(nullptr, readHandRecord(record.get()));
}

TEST(HandImage, CarefulHandsPassEveryLevelCarelessOnesTheFirstTwoStrangersNone) {
    for (uint32_t person = 0; person < 10; ++person) {
        const HandImage enrolled = seeHand(person, kCarefulNoise, person);
        EXPECT_LE(95, handSimilarity(enrolled, seeHand(person, kCarefulNoise, 100 + person)));
        const double careless =
                handSimilarity(enrolled, seeHand(person, kCarelessNoise, 200 + person));
        EXPECT_LE(75, careless) << person;
        EXPECT_GT(85, careless) << person;
        for (uint32_t other = 0; other < 10; ++other) {
            if (other != person) {
                EXPECT_GT(60, handSimilarity(enrolled, seeHand(other, kCarefulNoise, 300)))
                        << other;
            }
        }
    }
}

TEST(HandImage, ResemblesItselfAndNotAnEmptyOne) {
    const HandImage image = seeHand(3, kCarefulNoise, 1);
    EXPECT_DOUBLE_EQ(100, handSimilarity(image, image));
    EXPECT_EQ(0, handSimilarity(image, HandImage{}));
}

}  // namespace pemaro::simulator
