// SPDX-License-Identifier: Apache-2.0
// The services of one process together.

#include "simulator/TouchStack.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "pemaro/GestureManagerClient.h"
#include "pemaro/TouchManagerClient.h"
#include "pemaro/testkit/FakeServiceManager.h"

using testing::ElementsAre;

namespace pemaro::simulator {

namespace {

Fault fault(const char* text) {
    std::string problem;
    const auto parsed = Fault::parse(text, &problem);
    EXPECT_TRUE(parsed) << problem;
    return parsed.value_or(Fault{});
}

bool isServed(const test::ScopedServiceManager& services, const char* name) {
    return services->checkService(android::String16(name)) != nullptr;
}

}  // namespace

TEST(TouchStack, ServesAllFourUnlessToldOtherwise) {
    test::ScopedServiceManager services;
    TouchStack stack((TouchStack::Options()));
    EXPECT_EQ("", stack.registerAll());
    EXPECT_TRUE(isServed(services, "pemaro.TouchService"));
    EXPECT_TRUE(isServed(services, "pemaro.TouchManagerService"));
    EXPECT_TRUE(isServed(services, "pemaro.GestureManagerService"));
    EXPECT_TRUE(isServed(services, "pemaro.HandBiometricManagerService"));
}

TEST(TouchStack, LeavesOutWhatIsSwitchedOff) {
    test::ScopedServiceManager services;
    TouchStack::Options options;
    options.services = {ServiceKind::kHand};
    TouchStack stack(options);
    stack.order(fault("touch.enable=status:1"));
    EXPECT_EQ("", stack.registerAll());
    EXPECT_FALSE(isServed(services, "pemaro.TouchService"));
    EXPECT_FALSE(isServed(services, "pemaro.TouchManagerService"));
    EXPECT_FALSE(isServed(services, "pemaro.GestureManagerService"));
    EXPECT_TRUE(isServed(services, "pemaro.HandBiometricManagerService"));
    EXPECT_THAT(stack.summary(), ElementsAre("hand: 0 events, 0 delivered, 0 failed, 0 dropped"));
}

TEST(TouchStack, AFaultIsOfOneServiceAlone) {
    test::ScopedServiceManager services;
    TouchStack stack((TouchStack::Options()));
    stack.order(fault("gesture.subscribe=status:0x40000006"));
    ASSERT_EQ("", stack.registerAll());
    const android::sp<TouchManagerClient> touch = new TouchManagerClient();
    EXPECT_EQ(0, touch->init());
    touch->deinit();
    const android::sp<GestureManagerClient> gesture = new GestureManagerClient();
    EXPECT_EQ(0x40000006, gesture->init());
}

TEST(TouchStack, SumsUpWhatWasDone) {
    TouchStack stack((TouchStack::Options()));
    stack.shutDown();
    EXPECT_THAT(stack.summary(),
                ElementsAre("stopped: 0 recordings, 0 frames, 0 without room in the ring",
                            "touch: 0 events, 0 delivered, 0 failed, 0 dropped",
                            "gesture: 0 events, 0 delivered, 0 failed, 0 dropped",
                            "hand: 0 events, 0 delivered, 0 failed, 0 dropped"));
}

TEST(ServiceKind, IsFoundByItsShortName) {
    for (const ServiceKind service : kServiceKinds) {
        EXPECT_EQ(service, serviceKindOf(shortName(service)));
    }
    EXPECT_FALSE(serviceKindOf("foot"));
    EXPECT_FALSE(serviceKindOf(""));
}

TEST(ManagerFault, NamesItsService) {
    const struct {
        const char* text;
        ServiceKind service;
        const char* operation;
    } kRows[] = {
            {"open=die", ServiceKind::kCompanion, "open"},
            {"touch.configure_vm_region=die", ServiceKind::kTouch, "configure_vm_region"},
            {"gesture.improveGestureTraining=delay:5ms", ServiceKind::kGesture,
             "improveGestureTraining"},
            {"hand.subscribe=status:0x4000000B", ServiceKind::kHand, "subscribe"},
    };
    for (const auto& row : kRows) {
        const Fault parsed = fault(row.text);
        EXPECT_EQ(row.service, parsed.service) << row.text;
        EXPECT_EQ(row.operation, parsed.operation) << row.text;
    }
}

TEST(ManagerFault, RefusesWhatNoServiceHas) {
    for (const char* name : {"subscribe", "touch.scan", "hand.", ".scan", "foot.scan",
                             "companion.open", "hand.scan.scan"}) {
        std::string problem;
        EXPECT_FALSE(Fault::parse(std::string(name) + "=die", &problem)) << name;
        EXPECT_EQ(std::string("the service has no operation '") + name + "'", problem);
    }
}

}  // namespace pemaro::simulator
