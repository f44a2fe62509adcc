// SPDX-License-Identifier: Apache-2.0
// Configuration, events, sessions and authentication of TouchCompanionClient.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <numeric>
#include <string>
#include <vector>

#include "pemaro/testkit/LogRecorder.h"
#include "tests/companion/TouchCompanionRemoteTest.h"

namespace pemaro::test {
namespace {

using android::Parcel;
using android::sp;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::Not;

using TouchCompanionConfig = TouchCompanionRemoteTest;

const std::string kPath = "/data/touch.conf";
const std::string kNoPath;
const uint8_t kBlock[] = {0, 1, 2, 0xFF, 4};
unsigned int gInspected;
int gSession;

// ---- one call, and its status ----

struct Operation {
    const char* what;
    int (*call)(TouchCompanionClient& client);
    uint32_t code;
    ParcelWriter arguments;
    std::string service;  // the service's own operation
    std::string note;     // what reached it
    Lines failure;        // what the client logs for status 0x40000019
};

const std::vector<Operation>& operations() {
    static const std::vector<Operation>& all = *new std::vector<Operation>{
            {"sendEvent",
             [](auto& c) { return c.sendEvent(eventType(3), eventParam(-1)); },
             9,
             [](Parcel& p) {
                 p.writeInt32(3);
                 p.writeInt32(-1);
             },
             "sendEvent",
             "sendEvent(3,-1)",
             {"E sendEvent failed"}},
            {"reloadConfig without a path",
             [](auto& c) { return c.reloadConfig(nullptr); },
             11,
             {},
             "reloadConfig",
             "reloadConfig(null)",
             {"E reloadConfig failed"}},
            {"reloadConfig with a path",
             [](auto& c) { return c.reloadConfig(&kPath); },
             12,
             [](Parcel& p) { writeString8(p, kPath); },
             "reloadConfig",
             "reloadConfig(/data/touch.conf)",
             {"E reloadConfig failed"}},
            {"reloadConfig with an empty path",
             [](auto& c) { return c.reloadConfig(&kNoPath); },
             12,
             [](Parcel& p) { writeString8(p, ""); },
             "reloadConfig",
             "reloadConfig()",
             {"E reloadConfig failed"}},
            {"saveConfig without a path",
             [](auto& c) { return c.saveConfig(nullptr); },
             18,
             {},
             "saveConfig",
             "saveConfig(null)",
             {"E saveConfig failed"}},
            {"saveConfig with a path",
             [](auto& c) { return c.saveConfig(&kPath); },
             19,
             [](Parcel& p) { writeString8(p, kPath); },
             "saveConfig",
             "saveConfig(/data/touch.conf)",
             {"E saveConfig failed"}},
            {"saveConfig with an empty path",
             [](auto& c) { return c.saveConfig(&kNoPath); },
             19,
             [](Parcel& p) { writeString8(p, ""); },
             "saveConfig",
             "saveConfig()",
             {"E saveConfig failed"}},
            {"setConfigParams",
             [](auto& c) { return c.setConfigParams(kBlock, sizeof(kBlock)); },
             21,
             [](Parcel& p) {
                 p.writeInt32(sizeof(kBlock));
                 p.write(kBlock, sizeof(kBlock));
             },
             "setConfigParams",
             "setConfigParams(binary)",
             {"E setConfigParams (binary) failed"}},
            {"getConfigParams of a map",
             [](auto& c) {
                 SerializableMap params = mapOf(R"({"gain":""})");
                 return c.getConfigParams(params);
             },
             24,
             [](Parcel& p) { writeString8(p, R"({"gain":""})"); },
             "getConfigParams",
             R"(getConfigParams({"gain":""}))",
             {}},
            {"inspect",
             [](auto& c) { return c.inspect(&gInspected); },
             23,
             {},
             "inspect",
             "inspect",
             {}},
            {"saveSession",
             [](auto& c) {
                 gSession = 5;
                 return c.saveSession(gSession);
             },
             26,
             {},
             "saveSession",
             "saveSession",
             {"D saveSession E 5", "D saveSession X= 1073741849"}},
            {"restoreSession",
             [](auto& c) { return c.restoreSession(7); },
             27,
             [](Parcel& p) { p.writeInt32(7); },
             "restoreSession",
             "restoreSession(7)",
             {"D restoreSession E 7", "D restoreSession X= 1073741849"}},
            {"setAuth",
             [](auto& c) { return c.setAuth("open sesame"); },
             28,
             [](Parcel& p) { writeString8(p, "open sesame"); },
             "setAuth",
             "setAuth(open sesame)",
             {"E setAuth failed"}},
    };
    return all;
}

TEST_F(TouchCompanionConfig, EachOperationIsOneCallWithItsArguments) {
    for (const Operation& operation : operations()) {
        SCOPED_TRACE(operation.what);
        forget();
        mRemote->clearTransactions();
        EXPECT_EQ(0, operation.call(*mClient));
        expectSent(operation.code, operation.arguments);
        EXPECT_THAT(mService->calls(), ElementsAre(operation.note));
    }
}

TEST_F(TouchCompanionConfig, TheServicesStatusIsPassedOnWithOneLine) {
    for (const Operation& operation : operations()) {
        SCOPED_TRACE(operation.what);
        mService->setStatus(operation.service, STATUS_NOT_FOUND);
        forget();
        EXPECT_EQ(STATUS_NOT_FOUND, operation.call(*mClient));
        EXPECT_EQ(operation.failure, clientLines());
        mService->setStatus(operation.service, 0);
    }
}

TEST_F(TouchCompanionConfig, AFailedTransactionIsAnUnknownError) {
    mRemote->fail(android::DEAD_OBJECT);
    for (const Operation& operation : operations()) {
        SCOPED_TRACE(operation.what);
        forget();
        EXPECT_EQ(0x40000000, operation.call(*mClient));
        EXPECT_EQ(operation.failure.size(), clientLines().size());
        EXPECT_THAT(mService->calls(), IsEmpty());
    }
}

TEST_F(TouchCompanionConfig, SuccessIsSilentButForSessions) {
    for (const Operation& operation : operations()) {
        SCOPED_TRACE(operation.what);
        forget();
        EXPECT_EQ(0, operation.call(*mClient));
        if (operation.service == "saveSession") {
            EXPECT_THAT(clientLines(), ElementsAre("D saveSession E 5", "D saveSession X= 0"));
        } else if (operation.service == "restoreSession") {
            EXPECT_THAT(clientLines(),
                        ElementsAre("D restoreSession E 7", "D restoreSession X= 0"));
        } else {
            EXPECT_THAT(clientLines(), IsEmpty());
        }
    }
}

TEST(TouchCompanionConfigUnconnected, EachOperationSaysThatThereIsNoService) {
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    for (const Operation& operation : operations()) {
        SCOPED_TRACE(operation.what);
        clearLog();
        EXPECT_EQ(0x4000000B, operation.call(*client));
        if (operation.service == "saveSession") {
            EXPECT_THAT(linesOf(kClientTag),
                        ElementsAre("D saveSession E 5", "D saveSession X= 1073741835"));
        } else if (operation.service == "restoreSession") {
            EXPECT_THAT(linesOf(kClientTag),
                        ElementsAre("D restoreSession E 7", "D restoreSession X= 1073741835"));
        } else {
            EXPECT_THAT(linesOf(kClientTag), IsEmpty());
        }
    }
    clearLog();
    EXPECT_EQ(0x4000000B, client->getPacketSize());
    size_t length = 1;
    EXPECT_EQ(0x4000000B, client->getConfigParams(&length, &length));
    EXPECT_EQ(1u, length);
    EXPECT_THAT(linesOf(kClientTag), IsEmpty());
    EXPECT_EQ(0x4000001B, client->getConfigParams(nullptr, nullptr));
    EXPECT_THAT(linesOf(kClientTag), ElementsAre("E Error: len cannot be null!"));
}

TEST(TouchCompanionConfigUnconnected, AskingForNothingSucceeds) {
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    clearLog();
    SerializableMap params;
    EXPECT_EQ(0, client->getConfigParams(params));
    EXPECT_THAT(linesOf(kClientTag),
                ElementsAre("D params map is empty...no config values were retrieved"));
}

// ---- results ----

TEST_F(TouchCompanionConfig, EventsKeepAll32Bits) {
    EXPECT_EQ(0, mClient->sendEvent(eventType(INT32_MIN), eventParam(INT32_MAX)));
    EXPECT_THAT(mService->calls(), ElementsAre("sendEvent(-2147483648,2147483647)"));
}

TEST_F(TouchCompanionConfig, InspectionIsRead) {
    mService->inspection = 0xFEDCBA98;
    unsigned int value = 1;
    EXPECT_EQ(0, mClient->inspect(&value));
    EXPECT_EQ(0xFEDCBA98u, value);

    mService->setStatus("inspect", STATUS_UNSUPPORTED);
    value = 1;
    EXPECT_EQ(STATUS_UNSUPPORTED, mClient->inspect(&value));
    EXPECT_EQ(1u, value);
}

TEST_F(TouchCompanionConfig, SessionIdentifierIsRead) {
    mService->sessionID = 42;
    int session = -3;
    EXPECT_EQ(0, mClient->saveSession(session));
    EXPECT_EQ(42, session);
    EXPECT_THAT(clientLines(), ElementsAre("D saveSession E -3", "D saveSession X= 0"));

    mService->setStatus("saveSession", STATUS_NOT_FOUND);
    session = -3;
    EXPECT_EQ(STATUS_NOT_FOUND, mClient->saveSession(session));
    EXPECT_EQ(-3, session);
}

TEST_F(TouchCompanionConfig, PacketSizeIsWhateverTheServiceSays) {
    for (const int size : {0, 512, -1}) {
        mService->packetSize = size;
        EXPECT_EQ(size, mClient->getPacketSize());
    }
    mRemote->clearTransactions();
    mClient->getPacketSize();
    expectSent(20);
    mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(0x40000000, mClient->getPacketSize());
    EXPECT_THAT(clientLines(), IsEmpty());
}

TEST_F(TouchCompanionConfig, AuthenticationIsNeverLogged) {
    mService->setStatus("setAuth", STATUS_INVALID_ARGUMENTS);
    EXPECT_EQ(STATUS_INVALID_ARGUMENTS, mClient->setAuth("open sesame"));
    mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(0x40000000, mClient->setAuth("open sesame"));
    EXPECT_THAT(clientLines(), ElementsAre("E setAuth failed", "E setAuth failed"));
    for (const LogLine& line : LogRecorder::instance().lines()) {
        EXPECT_THAT(line.text, Not(HasSubstr("sesame")));
    }
}

TEST_F(TouchCompanionConfig, BinaryConfigurationIsReceivedWhole) {
    EXPECT_EQ(0, mClient->setConfigParams(kBlock, sizeof(kBlock)));
    EXPECT_EQ(Bytes(std::begin(kBlock), std::end(kBlock)), mService->receivedConfig);
    EXPECT_EQ(0, mClient->setConfigParams(kBlock, 0));
    EXPECT_THAT(mService->receivedConfig, IsEmpty());
}

// ---- map of values ----

TEST_F(TouchCompanionConfig, ValuesAreReadIntoTheMapThatNamesThem) {
    mService->params = mapOf(R"({"gain":3,"name":"pen"})");
    SerializableMap params = mapOf(R"({"gain":"","name":"","other":"kept"})");
    EXPECT_EQ(0, mClient->getConfigParams(params));
    expectSentText(24, R"({"gain":"","name":"","other":"kept"})");
    EXPECT_EQ(R"({"gain":3,"name":"pen","other":"kept"})", params.serialize());
}

TEST_F(TouchCompanionConfig, AskingForNothingMakesNoCall) {
    SerializableMap params;
    EXPECT_EQ(0, mClient->getConfigParams(params));
    EXPECT_THAT(clientLines(),
                ElementsAre("D params map is empty...no config values were retrieved"));
    expectNothingSent();
}

// ---- binary read ----

class BinaryConfig : public TouchCompanionRemoteTest {
  protected:
    void SetUp() override {
        TouchCompanionRemoteTest::SetUp();
        mService->config.resize(3001);
        std::iota(mService->config.begin(), mService->config.end(), uint8_t{1});
    }

    const Bytes& config() const { return mService->config; }

    static constexpr uint8_t kFill = 0xA5;
};

TEST_F(BinaryConfig, LengthIsAskedForAndThenTheBytes) {
    size_t length = 0;
    EXPECT_EQ(0, mClient->getConfigParams(nullptr, &length));
    ASSERT_EQ(config().size(), length);
    expectSent(22, [](Parcel& p) { p.writeInt32(0); });

    mRemote->clearTransactions();
    Bytes buffer(length);
    EXPECT_EQ(0, mClient->getConfigParams(buffer.data(), &length));
    EXPECT_EQ(config().size(), length);
    EXPECT_EQ(config(), buffer);
    expectSent(22, [](Parcel& p) { p.writeInt32(3001); });
    EXPECT_THAT(clientLines(), IsEmpty());
}

TEST_F(BinaryConfig, AskingForTheLengthCopiesNothing) {
    Bytes buffer(config().size(), kFill);
    size_t length = 0;
    EXPECT_EQ(0, mClient->getConfigParams(buffer.data(), &length));
    EXPECT_EQ(config().size(), length);
    EXPECT_EQ(Bytes(config().size(), kFill), buffer);
}

TEST_F(BinaryConfig, LargerBufferIsFilledInPart) {
    Bytes buffer(config().size() + 7, kFill);
    size_t length = buffer.size();
    EXPECT_EQ(0, mClient->getConfigParams(buffer.data(), &length));
    EXPECT_EQ(config().size(), length);
    EXPECT_EQ(0, memcmp(config().data(), buffer.data(), config().size()));
    EXPECT_EQ(Bytes(7, kFill), Bytes(buffer.end() - 7, buffer.end()));
}

TEST_F(BinaryConfig, SmallerBufferIsAnError) {
    Bytes buffer(config().size() - 1, kFill);
    size_t length = buffer.size();
    EXPECT_EQ(0x40000000, mClient->getConfigParams(buffer.data(), &length));
    EXPECT_EQ(config().size() - 1, length);
    EXPECT_EQ(Bytes(config().size() - 1, kFill), buffer);
    EXPECT_THAT(clientLines(), ElementsAre("E getConfigParams (binary) failed"));
}

// A service that answers with more than it was asked for, as a stub never does.
TEST_F(BinaryConfig, MoreThanTheBufferHoldsIsAnError) {
    mRemote->answer([](Parcel& reply) { reply.writeInt32(9); });
    uint8_t buffer[8];
    size_t length = sizeof(buffer);
    EXPECT_EQ(0x40000000, mClient->getConfigParams(buffer, &length));
    EXPECT_EQ(sizeof(buffer), length);
    EXPECT_THAT(clientLines(), ElementsAre("E something went wrong! returned len should not be "
                                           "larger than expected len."));
}

TEST_F(BinaryConfig, WithoutABufferNothingIsCopied) {
    size_t length = config().size() + 1;
    EXPECT_EQ(0, mClient->getConfigParams(nullptr, &length));
    EXPECT_EQ(config().size(), length);
    EXPECT_THAT(clientLines(), IsEmpty());
    EXPECT_EQ("E getConfigParams: Error! buffer is null!",
              linesOf("ITouchCompanionService").back());
}

TEST_F(BinaryConfig, WithoutALengthThereIsNoCall) {
    uint8_t buffer[8];
    EXPECT_EQ(0x4000001B, mClient->getConfigParams(buffer, nullptr));
    EXPECT_THAT(clientLines(), ElementsAre("E Error: len cannot be null!"));
    expectNothingSent();
}

TEST_F(BinaryConfig, NoConfigurationIsAnError) {
    mService->config.clear();
    for (const size_t capacity : {size_t{0}, size_t{8}}) {
        uint8_t buffer[8];
        size_t length = capacity;
        clearLog();
        EXPECT_EQ(0x40000000, mClient->getConfigParams(buffer, &length));
        EXPECT_EQ(capacity, length);
        EXPECT_THAT(clientLines(), ElementsAre("E getConfigParams (binary) failed"));
    }
}

TEST_F(BinaryConfig, FailedTransactionIsAnError) {
    mRemote->fail(android::DEAD_OBJECT);
    uint8_t buffer[8];
    size_t length = sizeof(buffer);
    EXPECT_EQ(0x40000000, mClient->getConfigParams(buffer, &length));
    EXPECT_EQ(sizeof(buffer), length);
    EXPECT_THAT(clientLines(), ElementsAre("E getConfigParams (binary) failed"));
}

}  // namespace
}  // namespace pemaro::test
