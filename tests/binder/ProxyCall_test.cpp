// SPDX-License-Identifier: Apache-2.0
#include "binder/ProxyCall.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <utils/Errors.h>

#include <cerrno>
#include <string>
#include <vector>

#include "pemaro/Status.h"
#include "tests/support/LogLines.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::Parcel;
using android::sp;
using android::String16;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr ProxyRow kFull = {7, "Bp::full", "full() error: %s", "full() refused: %s"};
constexpr ProxyRow kBare = {8, nullptr, nullptr};

class ProxyCallTest : public ::testing::Test {
  protected:
    void SetUp() override { clearLog(); }

    int call(const ProxyRow& row) {
        ProxyCall call("Tag", row, String16("interface"));
        call.request.writeInt32(42);
        return call.transactForStatus(remote.get());
    }

    const sp<RecordingBinder> remote = new RecordingBinder;
};

TEST_F(ProxyCallTest, SendsTheTokenAndTheArgumentsSynchronously) {
    remote->answer([](Parcel& reply) { reply.writeInt32(0); });
    EXPECT_EQ(STATUS_NO_ERROR, call(kFull));
    EXPECT_EQ(7u, remote->lastTransaction().code);
    EXPECT_EQ(0u, remote->lastTransaction().flags);
    EXPECT_EQ(requestBytes("interface", [](Parcel& request) { request.writeInt32(42); }),
              remote->lastTransaction().request);
    EXPECT_THAT(linesOf("Tag"), ElementsAre("D Bp::full"));
}

TEST_F(ProxyCallTest, PassesTheServicesStatusOnAndLogsItsMessage) {
    remote->answer([](Parcel& reply) { reply.writeInt32(STATUS_NOT_FOUND); });
    EXPECT_EQ(STATUS_NOT_FOUND, call(kFull));
    EXPECT_THAT(linesOf("Tag"), ElementsAre("D Bp::full", "E full() refused: Not Found"));
}

TEST_F(ProxyCallTest, MakesEveryTransportFailureOneStatus) {
    for (const android::status_t failure :
         std::vector<android::status_t>{-EPIPE, -EPERM, android::UNKNOWN_ERROR, 4}) {
        clearLog();
        remote->fail(failure);
        EXPECT_EQ(STATUS_UNKNOWN_ERROR, call(kFull));
        EXPECT_THAT(linesOf("Tag"), ElementsAre("D Bp::full", std::string("E full() error: ") +
                                                                      transportText(failure)));
    }
    EXPECT_STREQ("Broken pipe", transportText(-EPIPE));
}

TEST_F(ProxyCallTest, LogsNothingWithoutTexts) {
    remote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, call(kBare));
    remote->answer([](Parcel& reply) { reply.writeInt32(STATUS_NOT_FOUND); });
    EXPECT_EQ(STATUS_NOT_FOUND, call(kBare));
    EXPECT_THAT(linesOf("Tag"), IsEmpty());
}

// An empty reply reads as 0, which is success: the transaction itself did not fail.
TEST_F(ProxyCallTest, TakesAnEmptyReplyForSuccess) {
    EXPECT_EQ(STATUS_NO_ERROR, call(kFull));
}

}  // namespace
}  // namespace pemaro::test
