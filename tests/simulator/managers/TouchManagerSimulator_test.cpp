// SPDX-License-Identifier: Apache-2.0
// The simulated touch manager, seen through the library's client.

#include "simulator/managers/TouchManagerSimulator.h"

#include <gmock/gmock.h>

#include <memory>

#include "pemaro/TouchManagerClient.h"
#include "simulator/Panel.h"
#include "tests/simulator/managers/ManagerSimulatorTest.h"

using testing::Each;
using testing::ElementsAre;

namespace pemaro::simulator {

namespace {

using test::RecordCollector;

struct TouchManagerSimulatorTest : ManagerSimulatorTest<TouchManagerSimulator, TouchManagerClient> {
    TouchManagerSimulatorTest()
            : ManagerSimulatorTest(
                      ServiceKind::kTouch,
                      new TouchManagerClient(RecordCollector::onEvent<Gesture>, &events)) {}

    using Gesture = ITouchManagerClient::GestureData;

    // The first `count` gestures that were reported.
    std::vector<std::shared_ptr<const GestureRecord>> gestures(size_t count) {
        EXPECT_TRUE(events.await(count));
        std::vector<std::shared_ptr<const GestureRecord>> result;
        for (const std::string& bytes : events.records()) {
            result.push_back(readGestureRecord(bytes.data()));
            EXPECT_NE(nullptr, result.back());
        }
        EXPECT_EQ(count, result.size());
        return result;
    }

    template <typename Field>
    std::vector<Field> fields(size_t count, Field GestureRecord::*field) {
        std::vector<Field> result;
        for (const auto& gesture : gestures(count)) {
            result.push_back((*gesture).*field);
        }
        return result;
    }
};

}  // namespace

TEST_F(TouchManagerSimulatorTest, SupportsFourFeaturesAllOfThemDisabled) {
    for (int feature = -1; feature <= 6; ++feature) {
        bool supported = feature < 1;
        bool enabled = true;
        EXPECT_EQ(0, client->isSupported(feature, supported));
        EXPECT_EQ(0, client->isEnabled(feature, enabled));
        EXPECT_EQ(feature >= 1 && feature <= 4, supported) << feature;
        EXPECT_FALSE(enabled) << feature;
    }
}

TEST_F(TouchManagerSimulatorTest, SwitchesOnlySupportedFeatures) {
    EXPECT_EQ(0x4000000E, client->enable(5));
    EXPECT_EQ(0x4000000E, client->disable(0));
    bool enabled = false;
    EXPECT_EQ(0, client->enable(3));
    EXPECT_EQ(0, client->isEnabled(3, enabled));
    EXPECT_TRUE(enabled);
    EXPECT_EQ(0, client->disable(3));
    EXPECT_EQ(0, client->isEnabled(3, enabled));
    EXPECT_FALSE(enabled);
}

TEST_F(TouchManagerSimulatorTest, ReportsTheGesturesOfEnabledFeaturesInTurn) {
    tick(3);
    client->enable(2);
    client->enable(3);
    tick(4);
    EXPECT_THAT(fields(4, &GestureRecord::gesture), ElementsAre(5, 6, 7, 5));
    EXPECT_THAT(fields(4, &GestureRecord::feature), ElementsAre(2, 3, 3, 2));
    EXPECT_THAT(fields(4, &GestureRecord::sequence), ElementsAre(0u, 1u, 2u, 3u));
    EXPECT_THAT(fields(4, &GestureRecord::flags), Each(0u));
    client->disable(2);
    client->disable(3);
    tick(3);
    EXPECT_EQ(4u, service->counts().published);
}

TEST_F(TouchManagerSimulatorTest, MarksTheGesturesInTheRegion) {
    android::Rect whole(0, 0, kPanelWidth, kPanelHeight);
    android::Rect beside(-100, -100, 0, 0);
    client->enable(4);
    EXPECT_EQ(0, client->configure_vm_region(whole, true));
    tick(1);
    EXPECT_EQ(0, client->configure_vm_region(beside, true));
    tick(1);
    EXPECT_EQ(0, client->configure_vm_region(whole, false));
    tick(1);
    EXPECT_THAT(fields(3, &GestureRecord::flags),
                ElementsAre(kGestureRegionOn | kGestureInsideRegion, kGestureRegionOn, 0u));
}

TEST_F(TouchManagerSimulatorTest, RefusesAnEmptyRegion) {
    android::Rect narrow(5, 0, 5, 10);
    android::Rect flat(0, 10, 5, 10);
    EXPECT_EQ(0x4000000D, client->configure_vm_region(narrow, true));
    EXPECT_EQ(0x4000000D, client->configure_vm_region(flat, false));
}

TEST_F(TouchManagerSimulatorTest, SubscribingTwiceAndLeavingOnceLeavesNobody) {
    EXPECT_EQ(0, client->init());
    EXPECT_EQ(1u, service->counts().subscribers);
    client->deinit();
    EXPECT_EQ(0u, service->counts().subscribers);
}

TEST_F(TouchManagerSimulatorTest, AnswersForSubscribersThatItDoesNotKnow) {
    EXPECT_EQ(0x4000000D, service->subscribe(nullptr));
    EXPECT_EQ(0x4000000D, service->unsubscribe(nullptr));
    const android::sp<TouchManagerClient> stranger = new TouchManagerClient();
    EXPECT_EQ(0x40000019, service->unsubscribe(stranger));
}

TEST_F(TouchManagerSimulatorTest, FaultsTakeTheOperationsPlace) {
    order("touch.isSupported=status:0x40000005");
    bool supported = true;
    EXPECT_EQ(0x40000005, client->isSupported(1, supported));
    EXPECT_FALSE(supported);
    service->faults().clear();
    order("touch.enable=status:0x40000015");
    order("touch.enable=delay:1ms");
    EXPECT_EQ(0x40000015, client->enable(1));
    tick(1);
    EXPECT_EQ(0u, service->counts().published);
}

TEST_F(TouchManagerSimulatorTest, AFaultOfSubscribeReachesInit) {
    client->deinit();
    order("touch.subscribe=status:0x40000006");
    EXPECT_EQ(0x40000006, client->init());
    service->faults().clear();
    EXPECT_EQ(0, client->init());
}

TEST(TouchManagerSimulator, ItsOwnClockReports) {
    test::ScopedServiceManager services;
    test::RecordCollector events;
    ManagerOptions options;
    options.gestureRate = 1000;
    const android::sp<TouchManagerSimulator> service = new TouchManagerSimulator(options);
    services->add("pemaro.TouchManagerService", service);
    const android::sp<TouchManagerClient> client = new TouchManagerClient(
            RecordCollector::onEvent<ITouchManagerClient::GestureData>, &events);
    ASSERT_EQ(0, client->init());
    ASSERT_EQ(0, client->enable(1));
    EXPECT_TRUE(events.await(10));
    client->deinit();
    service->shutDown();
}

}  // namespace pemaro::simulator
