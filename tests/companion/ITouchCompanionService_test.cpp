// SPDX-License-Identifier: Apache-2.0
#include "pemaro/ITouchCompanionService.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <utils/String8.h>

#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/BpTouchCompanionService.h"
#include "pemaro/Status.h"
#include "pemaro/testkit/FakeTouchCompanionService.h"
#include "tests/support/RecordingBinder.h"
#include "tests/support/VirtualSlot.h"

namespace pemaro::test {
namespace {

using android::sp;
using ::testing::ElementsAre;
using Service = ITouchCompanionService;

TEST(ITouchCompanionService, HasTheNameOfTheServiceAsDescriptor) {
    const sp<FakeTouchCompanionService> service = new FakeTouchCompanionService;
    EXPECT_STREQ("pemaro.TouchService", android::String8(Service::descriptor).c_str());
    EXPECT_EQ(Service::descriptor, static_cast<Service&>(*service).getInterfaceDescriptor());
    EXPECT_EQ(Service::descriptor,
              static_cast<android::BBinder&>(*service).getInterfaceDescriptor());
}

TEST(ITouchCompanionService, CastsNullToNull) {
    EXPECT_EQ(nullptr, Service::asInterface(nullptr));
}

TEST(ITouchCompanionService, CastsALocalObjectToItself) {
    const sp<FakeTouchCompanionService> service = new FakeTouchCompanionService;
    EXPECT_EQ(static_cast<Service*>(service.get()),
              Service::asInterface(android::IInterface::asBinder(sp<Service>(service))).get());
}

TEST(ITouchCompanionService, CastsAnyOtherBinderToAProxy) {
    const sp<RecordingBinder> remote = new RecordingBinder;
    const sp<Service> proxy = Service::asInterface(remote);
    ASSERT_NE(nullptr, proxy);
    EXPECT_EQ(remote, android::IInterface::asBinder(proxy));
    EXPECT_NE(proxy, Service::asInterface(remote)) << "a proxy each time";
    proxy->open();
    EXPECT_EQ(1u, remote->transactions().size());
}

// A local object of another interface is no service: a proxy is put around it.
TEST(ITouchCompanionService, CastsALocalObjectOfAnotherInterfaceToAProxy) {
    const sp<BnTouchCompanionClient> other = new BnTouchCompanionClient;
    const sp<Service> proxy = Service::asInterface(other);
    ASSERT_NE(nullptr, proxy);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, proxy->open());
}

// The slots before the operations: two destructors, onAsBinder() and getInterfaceDescriptor().
constexpr int kFirst = 4;

TEST(ITouchCompanionService, KeepsTheOrderOfItsVirtualSlots) {
    const int slots[] = {
            slotOf(&Service::registerClient),
            slotOf(&Service::unregisterClient),
            slotOf(&Service::open),
            slotOf(&Service::getCblk),
            slotOf(&Service::prepareRecord),
            slotOf(&Service::startRecord),
            slotOf(&Service::stopRecord),
            slotOf(&Service::setRecordParameter),
            slotOf(&Service::setRecordFile),
            slotOf(&Service::sendEvent),
            slotOf(&Service::close),
            slotOf(&Service::reloadConfig),
            slotOf(&Service::saveConfig),
            slotOf<size_t (Service::*)(void*, size_t)>(&Service::getConfigParams),
            slotOf<int (Service::*)(SerializableMap&)>(&Service::getConfigParams),
            slotOf(&Service::setConfigParams),
            slotOf(&Service::getProperties),
            slotOf(&Service::sendCommand),
            slotOf(&Service::setAFEParams),
            slotOf<int (Service::*)(SerializableMap&)>(&Service::getAFEParams),
            slotOf<int (Service::*)(SerializableMapArray&)>(&Service::getAFEParams),
            slotOf(&Service::getPacketSize),
            slotOf(&Service::inspect),
            slotOf(&Service::saveSession),
            slotOf(&Service::restoreSession),
            slotOf(&Service::setAuth),
    };
    int expected = kFirst;
    for (int slot : slots) {
        EXPECT_EQ(expected++, slot);
    }
}

TEST(ITouchCompanionService, IsCalledThroughItsSlots) {
    const sp<FakeTouchCompanionService> fake = new FakeTouchCompanionService;
    Service& service = *fake;
    EXPECT_EQ(0, (service.*memberAt<int (Service::*)()>(kFirst + 2))());
    EXPECT_EQ(0, (service.*memberAt<int (Service::*)(int)>(kFirst + 7))(1));
    EXPECT_EQ(0u, (service.*memberAt<size_t (Service::*)(void*, size_t)>(kFirst + 13))(nullptr, 0));
    EXPECT_EQ(0, (service.*memberAt<int (Service::*)(const std::string&)>(kFirst + 25))("a"));
    EXPECT_THAT(fake->calls(), ElementsAre("open", "setRecordParameter(1)",
                                           "getConfigParams(binary)", "setAuth(a)"));
}

}  // namespace
}  // namespace pemaro::test
