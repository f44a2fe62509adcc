// SPDX-License-Identifier: Apache-2.0
// What callers and services are compiled against: descriptors, casts, slots, sizes.

#include <gtest/gtest.h>

#include <string>
#include <type_traits>
#include <vector>

#include "pemaro/BpGestureManagerService.h"
#include "pemaro/BpHandBiometricManagerService.h"
#include "pemaro/BpTouchManagerService.h"
#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/TouchManagerClient.h"
#include "tests/managers/RecordingManagers.h"
#include "tests/support/RecordingBinder.h"
#include "tests/support/VirtualSlot.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::sp;
using android::String16;
using android::wp;

template <typename I, typename L, const char* kName>
struct InterfaceCase {
    using Interface = I;
    using Local = L;
    static constexpr const char* kDescriptor = kName;
};

constexpr char kTouchService[] = "pemaro.TouchManagerService";
constexpr char kTouchClient[] = "pemaro.TouchManagerClient";
constexpr char kGestureService[] = "pemaro.GestureManagerService";
constexpr char kGestureClient[] = "pemaro.GestureManagerClient";
constexpr char kHandService[] = "pemaro.HandBiometricManagerService";
constexpr char kHandClient[] = "pemaro.HandBiometricManagerClient";

using Interfaces = ::testing::Types<
        InterfaceCase<ITouchManagerService, RecordingTouchManagerService, kTouchService>,
        InterfaceCase<ITouchManagerClient, RecordingTouchManagerClient, kTouchClient>,
        InterfaceCase<IGestureManagerService, RecordingGestureManagerService, kGestureService>,
        InterfaceCase<IGestureManagerClient, RecordingGestureManagerClient, kGestureClient>,
        InterfaceCase<IHandBiometricManagerService, RecordingHandBiometricManagerService,
                      kHandService>,
        InterfaceCase<IHandBiometricManagerClient, RecordingHandBiometricManagerClient,
                      kHandClient>>;

template <typename T>
class ManagerInterface : public ::testing::Test {};
TYPED_TEST_SUITE(ManagerInterface, Interfaces);

TYPED_TEST(ManagerInterface, HasItsDescriptor) {
    const String16 expected(TypeParam::kDescriptor);
    EXPECT_EQ(expected, TypeParam::Interface::descriptor);
    const sp<typename TypeParam::Local> local = new typename TypeParam::Local;
    EXPECT_EQ(expected, local->getInterfaceDescriptor());
}

TYPED_TEST(ManagerInterface, CastsNullToNull) {
    EXPECT_EQ(nullptr, TypeParam::Interface::asInterface(nullptr));
}

TYPED_TEST(ManagerInterface, CastsALocalObjectToItself) {
    const sp<typename TypeParam::Interface> local = new typename TypeParam::Local;
    EXPECT_EQ(local, TypeParam::Interface::asInterface(android::IInterface::asBinder(local)));
}

TYPED_TEST(ManagerInterface, CastsAnyOtherBinderToAProxy) {
    const sp<RecordingBinder> remote = new RecordingBinder;
    const sp<typename TypeParam::Interface> proxy = TypeParam::Interface::asInterface(remote);
    ASSERT_NE(nullptr, proxy);
    EXPECT_EQ(remote, android::IInterface::asBinder(proxy));
    EXPECT_EQ(String16(TypeParam::kDescriptor), proxy->getInterfaceDescriptor());
}

// ---- slots ----

std::vector<int> consecutive(int first, size_t count) {
    std::vector<int> slots;
    for (size_t i = 0; i < count; ++i) {
        slots.push_back(first + static_cast<int>(i));
    }
    return slots;
}

void expectConsecutive(const std::vector<int>& slots) {
    EXPECT_LT(0, slots[0]);
    EXPECT_EQ(consecutive(slots[0], slots.size()), slots);
}

TEST(ManagerSlots, OfTheTouchManagerStandInOrder) {
    using I = ITouchManagerService;
    expectConsecutive({slotOf(&I::subscribe), slotOf(&I::unsubscribe), slotOf(&I::isSupported),
                       slotOf(&I::isEnabled), slotOf(&I::enable), slotOf(&I::disable),
                       slotOf(&I::configure_vm_region)});
}

TEST(ManagerSlots, OfTheGestureManagerStandInOrder) {
    using I = IGestureManagerService;
    expectConsecutive({slotOf(&I::subscribe), slotOf(&I::unsubscribe), slotOf(&I::enableWakeup),
                       slotOf(&I::disableWakeup), slotOf(&I::startGestureDetection),
                       slotOf(&I::stopGestureDetection), slotOf(&I::addGesture),
                       slotOf(&I::deleteGesture), slotOf(&I::enableGesture),
                       slotOf(&I::disableGesture), slotOf(&I::improveGestureTraining),
                       slotOf(&I::getMaxPreDefinedGesture), slotOf(&I::getMaxUserDefinedGesture)});
}

TEST(ManagerSlots, OfTheHandBiometricManagerStandInOrder) {
    using I = IHandBiometricManagerService;
    expectConsecutive({slotOf(&I::subscribe), slotOf(&I::unsubscribe), slotOf(&I::startEnrollment),
                       slotOf(&I::stopEnrollment), slotOf(&I::scan), slotOf(&I::startMatching),
                       slotOf(&I::stopMatching), slotOf(&I::cancelScan), slotOf(&I::setSecurity),
                       slotOf(&I::setProfileName), slotOf(&I::deleteProfile),
                       slotOf(&I::renameProfile), slotOf(&I::getMaxUser),
                       slotOf(&I::getProfileList), slotOf(&I::enableWakeup),
                       slotOf(&I::disableWakeup)});
}

TEST(ManagerSlots, OfTheClientsFollowTheBinderClasses) {
    const int first = slotOf(&ITouchManagerService::subscribe);
    EXPECT_EQ(first, slotOf(&ITouchManagerClient::gestureCallback));
    EXPECT_EQ(first, slotOf(&IGestureManagerClient::gestureCallback));
    EXPECT_EQ(first, slotOf(&IHandBiometricManagerClient::handBiometricCallback));
    // The clients add none of their own: what the callbacks have is what is called.
    EXPECT_EQ(first, slotOf(&TouchManagerClient::gestureCallback));
    EXPECT_EQ(first, slotOf(&GestureManagerClient::gestureCallback));
    EXPECT_EQ(first, slotOf(&HandBiometricManagerClient::handBiometricCallback));
}

// ---- types ----

template <typename Record>
constexpr bool kIsPlain =
        std::is_trivially_copyable_v<Record>&& std::is_standard_layout_v<Record> &&
        alignof(Record) == 1;

TEST(ManagerRecords, ArePlainBytesOfFixedSize) {
    EXPECT_EQ(72144u, sizeof(ITouchManagerClient::GestureData));
    EXPECT_EQ(72144u, sizeof(IGestureManagerClient::GestureData));
    EXPECT_EQ(10016u, sizeof(IHandBiometricManagerClient::HandBioData));
    EXPECT_TRUE(kIsPlain<ITouchManagerClient::GestureData>);
    EXPECT_TRUE(kIsPlain<IGestureManagerClient::GestureData>);
    EXPECT_TRUE(kIsPlain<IHandBiometricManagerClient::HandBioData>);
    EXPECT_FALSE(
            (std::is_same_v<ITouchManagerClient::GestureData, IGestureManagerClient::GestureData>));
}

TEST(ManagerClients, AreTheirOwnCallbackBinderAndDeathRecipient) {
    EXPECT_TRUE((std::is_base_of_v<BnTouchManagerClient, TouchManagerClient>));
    EXPECT_FALSE((std::is_base_of_v<IBinder::DeathRecipient, TouchManagerClient>));
    EXPECT_TRUE((std::is_base_of_v<BnGestureManagerClient, GestureManagerClient>));
    EXPECT_TRUE((std::is_base_of_v<BnHandBiometricManagerClient, HandBiometricManagerClient>));

    // One object with one count, whichever of its sides is held.
    const sp<GestureManagerClient> client = new GestureManagerClient;
    const sp<IBinder::DeathRecipient> recipient = client;
    const sp<IGestureManagerClient> callback = client;
    EXPECT_EQ(3, client->getStrongCount());
    EXPECT_EQ(3, recipient->getStrongCount());
    EXPECT_EQ(client.get(), callback.get());
}

}  // namespace
}  // namespace pemaro::test
