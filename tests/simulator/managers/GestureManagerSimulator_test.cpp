// SPDX-License-Identifier: Apache-2.0
// The simulated gesture manager, seen through the library's client.

#include "simulator/managers/GestureManagerSimulator.h"

#include <gmock/gmock.h>

#include <cstring>
#include <memory>

#include "pemaro/GestureManagerClient.h"
#include "simulator/Panel.h"
#include "simulator/managers/Stroke.h"
#include "tests/simulator/managers/ManagerSimulatorTest.h"

using testing::Each;
using testing::ElementsAre;

namespace pemaro::simulator {

namespace {

using Gesture = IGestureManagerClient::GestureData;
using test::RecordCollector;

struct GestureManagerSimulatorTest
        : ManagerSimulatorTest<GestureManagerSimulator, GestureManagerClient> {
    GestureManagerSimulatorTest()
            : ManagerSimulatorTest(ServiceKind::kGesture,
                                   new GestureManagerClient(RecordCollector::onEvent<Gesture>,
                                                            RecordCollector::onDeath, &events)) {}

    // What the user draws: a shape of the panel's, mirrored, so that it is none of them.
    static Stroke mirrored(int shape, uint32_t variation) {
        Stroke stroke = drawShape(shape, variation);
        for (GesturePoint& point : stroke) {
            point.x = static_cast<uint16_t>(kPanelWidth - 1 - point.x);
        }
        return stroke;
    }

    static Gesture sample(const Stroke& stroke) {
        auto record = std::make_unique<GestureRecord>();
        setStroke(stroke, record.get());
        sealGestureRecord(record.get());
        Gesture gesture;
        memcpy(gesture.bytes, record.get(), sizeof(gesture.bytes));
        return gesture;
    }

    int add(const std::vector<Stroke>& strokes) {
        std::vector<Gesture> samples;
        for (const Stroke& stroke : strokes) {
            samples.push_back(sample(stroke));
        }
        int number = 0;
        addStatus = client->addGesture(static_cast<int>(samples.size()), samples.data(), number);
        return number;
    }

    int verify(const Stroke& stroke) {
        Gesture drawn = sample(stroke);
        int number = 0;
        verifyStatus = client->verifyGesture(&drawn, number);
        return number;
    }

    std::vector<std::shared_ptr<const GestureRecord>> gestures(size_t count) {
        EXPECT_TRUE(events.await(count));
        std::vector<std::shared_ptr<const GestureRecord>> result;
        for (const std::string& bytes : events.records()) {
            result.push_back(readGestureRecord(bytes.data()));
        }
        return result;
    }

    std::vector<int> numbers(size_t count) {
        std::vector<int> result;
        for (const auto& gesture : gestures(count)) {
            result.push_back(gesture->gesture);
        }
        return result;
    }

    int addStatus = -1;
    int verifyStatus = -1;
};

}  // namespace

TEST_F(GestureManagerSimulatorTest, TellsItsLimits) {
    unsigned int predefined = 0;
    unsigned int userDefined = 0;
    EXPECT_EQ(0, client->getMaxPreDefinedGesture(predefined));
    EXPECT_EQ(0, client->getMaxUserDefinedGesture(userDefined));
    EXPECT_EQ(8u, predefined);
    EXPECT_EQ(2u, userDefined);
}

TEST_F(GestureManagerSimulatorTest, ReportsWhileDetectionIsOn) {
    tick(3);
    EXPECT_EQ(0, client->startGestureDetection());
    for (int shape = 3; shape <= 8; ++shape) {
        EXPECT_EQ(0, client->disableGesture(shape));
    }
    tick(3);
    EXPECT_EQ(0, client->enableGesture(8));
    tick(1);
    EXPECT_THAT(numbers(4), ElementsAre(1, 2, 1, 1));
    EXPECT_EQ(0, client->stopGestureDetection());
    tick(3);
    EXPECT_EQ(4u, service->counts().published);
}

TEST_F(GestureManagerSimulatorTest, ReportsNothingWithEveryGestureDisabled) {
    for (int shape = 1; shape <= 8; ++shape) {
        EXPECT_EQ(0, client->disableGesture(shape));
    }
    EXPECT_EQ(0, client->startGestureDetection());
    tick(5);
    EXPECT_EQ(0u, service->counts().published);
}

TEST_F(GestureManagerSimulatorTest, WakesTheDeviceNowAndThen) {
    EXPECT_EQ(0, client->enableWakeup());
    tick(8);
    EXPECT_EQ(2u, service->counts().published);
    for (const auto& gesture : gestures(2)) {
        EXPECT_EQ(kGestureWakeup, gesture->flags);
    }
    EXPECT_EQ(0, client->startGestureDetection());
    tick(1);
    EXPECT_EQ(0u, gestures(3).back()->flags) << "awake";
    EXPECT_EQ(0, client->stopGestureDetection());
    EXPECT_EQ(0, client->disableWakeup());
    tick(8);
    EXPECT_EQ(3u, service->counts().published);
}

TEST_F(GestureManagerSimulatorTest, KnowsADefinedGestureAgain) {
    EXPECT_EQ(9, add({mirrored(7, 1), mirrored(7, 2)}));
    EXPECT_EQ(0, addStatus);
    EXPECT_EQ(10, add({drawShape(6, 1)}));
    EXPECT_EQ(9, verify(mirrored(7, 30)));
    EXPECT_EQ(0, verifyStatus);
    EXPECT_EQ(10, verify(drawShape(6, 30)));
    EXPECT_EQ(-1, verify(drawShape(1, 30)));
    EXPECT_EQ(0x40000019, verifyStatus);
}

TEST_F(GestureManagerSimulatorTest, DoesNotVerifyAgainstADisabledGesture) {
    add({mirrored(7, 1)});
    EXPECT_EQ(0, client->disableGesture(9));
    EXPECT_EQ(-1, verify(mirrored(7, 2)));
    EXPECT_EQ(0, client->enableGesture(9));
    EXPECT_EQ(9, verify(mirrored(7, 2)));
}

TEST_F(GestureManagerSimulatorTest, TakesItsOwnReportsAsSamples) {
    EXPECT_EQ(0, client->startGestureDetection());
    tick(1);
    gestures(1);
    Gesture reported;
    memcpy(reported.bytes, events.records()[0].data(), sizeof(reported.bytes));
    int number = 0;
    EXPECT_EQ(0, client->addGesture(1, &reported, number));
    EXPECT_EQ(9, number);
    EXPECT_EQ(9, verify(drawShape(1, 30)));
}

TEST_F(GestureManagerSimulatorTest, ReportsDefinedGesturesToo) {
    add({mirrored(7, 1)});
    for (int shape = 1; shape <= 8; ++shape) {
        client->disableGesture(shape);
    }
    client->startGestureDetection();
    tick(1);
    ASSERT_THAT(numbers(1), ElementsAre(9));
    EXPECT_LE(GestureManagerSimulator::kSimilarEnough,
              strokeSimilarity(mirrored(7, 1), strokeOf(*gestures(1)[0])));
}

TEST_F(GestureManagerSimulatorTest, HoldsNoMoreThanItsLimit) {
    EXPECT_EQ(9, add({drawShape(1, 1)}));
    EXPECT_EQ(10, add({drawShape(2, 1)}));
    EXPECT_EQ(-1, add({drawShape(3, 1)}));
    EXPECT_EQ(0x4000000A, addStatus);
    EXPECT_EQ(0, client->deleteGesture(9));
    EXPECT_EQ(9, add({drawShape(3, 1)}));
}

TEST_F(GestureManagerSimulatorTest, AnswersWhatMakesNoSense) {
    Gesture garbage{};
    int result = 5;
    EXPECT_EQ(0x4000000D, service->addGesture(0, &garbage, result));
    EXPECT_EQ(0x4000000D, service->addGesture(-1, nullptr, result));
    EXPECT_EQ(0x4000001B, service->addGesture(1, nullptr, result));
    EXPECT_EQ(0x4000000C, service->addGesture(1, &garbage, result));
    Gesture dot = sample({GesturePoint{}, GesturePoint{}});
    EXPECT_EQ(0x4000000C, service->addGesture(1, &dot, result));
    EXPECT_EQ(0x4000001B, service->improveGestureTraining(nullptr, result));
    EXPECT_EQ(0x4000000C, service->improveGestureTraining(&garbage, result));
    EXPECT_EQ(-1, result);
    EXPECT_EQ(0x40000019, client->deleteGesture(9));
    EXPECT_EQ(0x40000019, client->enableGesture(0));
    EXPECT_EQ(0x40000019, client->disableGesture(9));
    EXPECT_EQ(0x4000000E, client->deleteGesture(8));
}

TEST_F(GestureManagerSimulatorTest, OneBadSampleSpoilsTheGesture) {
    Gesture samples[2] = {sample(drawShape(1, 1)), Gesture{}};
    int number = 0;
    EXPECT_EQ(0x4000000C, client->addGesture(2, samples, number));
    EXPECT_EQ(-1, verify(drawShape(1, 1)));
}

TEST_F(GestureManagerSimulatorTest, FaultsTakeTheOperationsPlace) {
    order("gesture.getMaxUserDefinedGesture=status:0x40000005");
    unsigned int count = 7;
    EXPECT_EQ(0x40000005, client->getMaxUserDefinedGesture(count));
    EXPECT_EQ(0u, count);
    order("gesture.addGesture=status:0x40000006");
    EXPECT_EQ(-1, add({drawShape(1, 1)}));
    EXPECT_EQ(0x40000006, addStatus);
}

}  // namespace pemaro::simulator
