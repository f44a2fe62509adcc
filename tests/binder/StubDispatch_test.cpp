// SPDX-License-Identifier: Apache-2.0
#include "binder/StubDispatch.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/support/LogLines.h"
#include "tests/support/ParcelBytes.h"

namespace pemaro::test {
namespace {

using android::Parcel;
using android::sp;
using android::status_t;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr char kDescriptor[] = "interface";
constexpr status_t kFallback = 99;

struct StubbedService {
    int plain() { return 11; }
    int number(int value) { return value + 1; }
};

status_t onRefused(StubbedService&, const Parcel&, Parcel&) {
    return -5;
}

constexpr StubRow<StubbedService> kRows[] = {
        {replyPlain<&StubbedService::plain>},
        {replyInt<&StubbedService::number>, "received", "finished"},
        {onRefused, "received"},
};

class Stub : public android::BBinder {
  public:
    const android::String16& getInterfaceDescriptor() const override {
        static const android::String16 descriptor(kDescriptor);
        return descriptor;
    }

    status_t serve(uint32_t code, const ParcelWriter& write, Parcel* reply) {
        Parcel data;
        write(data);
        data.setDataPosition(0);
        return dispatch("Tag", kRows, *this, service, code, data, reply, [] { return kFallback; });
    }

    StubbedService service;
};

class StubDispatch : public ::testing::Test {
  protected:
    void SetUp() override { clearLog(); }

    status_t serve(uint32_t code) { return stub->serve(code, writeRequest, &reply); }

    static void writeRequest(Parcel& data) {
        writeToken(data, kDescriptor);
        data.writeInt32(41);
    }

    const sp<Stub> stub = new Stub;
    Parcel reply;
};

TEST_F(StubDispatch, RunsTheRowOfTheCode) {
    EXPECT_EQ(android::NO_ERROR, serve(1));
    EXPECT_EQ((Bytes{11, 0, 0, 0}), bytesOf(reply));
    EXPECT_THAT(linesOf("Tag"), IsEmpty());
}

TEST_F(StubDispatch, RunsAHandlerBetweenTheTextsOfItsRow) {
    EXPECT_EQ(android::NO_ERROR, serve(2));
    EXPECT_EQ((Bytes{42, 0, 0, 0}), bytesOf(reply));
    EXPECT_THAT(linesOf("Tag"), ElementsAre("D received", "D finished"));
}

TEST_F(StubDispatch, ReturnsTheResultOfTheHandler) {
    EXPECT_EQ(-5, serve(3));
    EXPECT_THAT(bytesOf(reply), IsEmpty());
}

TEST_F(StubDispatch, LeavesOtherCodesToTheBinder) {
    for (uint32_t code : {0u, 4u, 0xFFFFFFFFu}) {
        EXPECT_EQ(kFallback, serve(code));
    }
    EXPECT_THAT(linesOf("Tag"), IsEmpty());
}

TEST_F(StubDispatch, TestsTheTokenBeforeTheCode) {
    const ParcelWriter other = [](Parcel& data) { writeToken(data, "other"); };
    for (uint32_t code : {0u, 1u, 2u, 4u}) {
        EXPECT_EQ(android::PERMISSION_DENIED, stub->serve(code, other, &reply));
    }
    EXPECT_THAT(linesOf("Tag"), IsEmpty());
    EXPECT_THAT(bytesOf(reply), IsEmpty());
}

TEST_F(StubDispatch, NeedsNoReplyOfALocalCaller) {
    EXPECT_EQ(android::NO_ERROR, stub->serve(2, writeRequest, nullptr));
    EXPECT_THAT(linesOf("Tag"), ElementsAre("D received", "D finished"));
}

}  // namespace
}  // namespace pemaro::test
