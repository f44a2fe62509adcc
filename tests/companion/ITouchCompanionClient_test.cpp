// SPDX-License-Identifier: Apache-2.0
#include "pemaro/ITouchCompanionClient.h"

#include <gtest/gtest.h>
#include <utils/String8.h>

#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/BpTouchCompanionClient.h"
#include "tests/support/ParcelBytes.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::Parcel;
using android::sp;

constexpr char kClientDescriptor[] = "pemaro.TouchServiceClient";

TEST(ITouchCompanionClient, HasADescriptorOfItsOwn) {
    EXPECT_STREQ(kClientDescriptor, android::String8(ITouchCompanionClient::descriptor).c_str());
}

TEST(ITouchCompanionClient, CastsNullToNull) {
    EXPECT_EQ(nullptr, ITouchCompanionClient::asInterface(nullptr));
}

TEST(ITouchCompanionClient, CastsALocalObjectToItself) {
    const sp<ITouchCompanionClient> client = new BnTouchCompanionClient;
    EXPECT_EQ(client, ITouchCompanionClient::asInterface(android::IInterface::asBinder(client)));
}

TEST(ITouchCompanionClient, CastsARemoteBinderToAProxyOfIt) {
    const sp<RecordingBinder> remote = new RecordingBinder;
    const sp<ITouchCompanionClient> proxy = ITouchCompanionClient::asInterface(remote);
    ASSERT_NE(nullptr, proxy);
    EXPECT_EQ(remote, android::IInterface::asBinder(proxy));
    EXPECT_TRUE(remote->transactions().empty());
}

TEST(ITouchCompanionClient, RefusesRequestsWithoutTheToken) {
    const sp<BnTouchCompanionClient> client = new BnTouchCompanionClient;
    for (uint32_t code : {0u, 1u, uint32_t{IBinder::INTERFACE_TRANSACTION}}) {
        Parcel empty;
        Parcel reply;
        EXPECT_EQ(-1, client->transact(code, empty, &reply));
        Parcel foreign;
        writeToken(foreign, "pemaro.TouchService");
        EXPECT_EQ(-1, client->transact(code, foreign, &reply));
        EXPECT_EQ(0u, reply.dataSize());
    }
}

TEST(ITouchCompanionClient, LeavesRequestsWithTheTokenToThePlatform) {
    const sp<BnTouchCompanionClient> client = new BnTouchCompanionClient;
    Parcel data;
    writeToken(data, kClientDescriptor);
    Parcel reply;
    EXPECT_EQ(android::NO_ERROR, client->transact(IBinder::PING_TRANSACTION, data, &reply));
    EXPECT_EQ(android::NO_ERROR, client->transact(IBinder::INTERFACE_TRANSACTION, data, &reply));
    EXPECT_EQ(parcelBytes([](Parcel& p) { p.writeString16(android::String16(kClientDescriptor)); }),
              bytesOf(reply));
    EXPECT_EQ(android::UNKNOWN_TRANSACTION, client->transact(1, data, &reply));
}

}  // namespace
}  // namespace pemaro::test
