// SPDX-License-Identifier: Apache-2.0
// The stub of the touch companion service: for each transaction the call that it makes and the reply that it
// writes, and what it makes of requests that are not whole.

#include "pemaro/BnTouchCompanionService.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <cstring>
#include <set>
#include <string>

#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/Status.h"
#include "pemaro/testkit/FakeTouchCompanionService.h"
#include "tests/companion/CompanionInterface.h"
#include "tests/support/LocalMemory.h"
#include "tests/support/LogLines.h"
#include "tests/support/ParcelBytes.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr uint32_t kLastCode = 28;

class TouchCompanionStub : public ::testing::Test {
  protected:
    void SetUp() override {
        mService->properties.add("p", 1);
        mService->afeParams.add("gain", 2);
        mService->afeArray.add(3);
        mService->afeArray.add(std::string("x"));
        mService->params.add("found", 4);
        mService->response.add("answer", 5);
        mService->packetSize = 4096;
        mService->inspection = 0xfffffffe;
        mService->sessionID = 41;
        clearLog();
    }

    status_t transact(uint32_t code, const ParcelWriter& arguments) {
        Parcel data;
        writeToken(data, kDescriptor);
        arguments(data);
        return mService->transact(code, data, &mReply);
    }

    Bytes reply() const { return bytesOf(mReply); }

    const sp<FakeTouchCompanionService> mService = new FakeTouchCompanionService;
    Parcel mReply;
};

struct StubRow {
    const char* name;
    uint32_t code;
    void (*arguments)(Parcel& request);  // what follows the token
    const char* operation;               // whose status the service is told to return
    const char* call;                    // what the service sees
    void (*results)(Parcel& reply);      // what follows the status in the reply
};

const StubRow kStubRows[] = {
        {"registerClient", 1, [](Parcel& p) { p.writeStrongBinder(nullptr); }, "registerClient",
         "registerClient", nothing},
        {"open", 3, nothing, "open", "open", nothing},
        {"prepareRecord", 5, nothing, "prepareRecord", "prepareRecord", nothing},
        {"startRecord", 6, nothing, "startRecord", "startRecord", nothing},
        {"stopRecord", 7, nothing, "stopRecord", "stopRecord", nothing},
        {"setRecordFile", 8, [](Parcel& p) { writeString8(p, "/f"); }, "setRecordFile",
         "setRecordFile(/f)", nothing},
        {"sendEvent", 9,
         [](Parcel& p) {
             p.writeInt32(7);
             p.writeInt32(-8);
         },
         "sendEvent", "sendEvent(7,-8)", nothing},
        {"close", 10, nothing, "close", "close", nothing},
        {"reloadConfigWithoutPath", 11, nothing, "reloadConfig", "reloadConfig(null)", nothing},
        {"reloadConfigWithPath", 12, [](Parcel& p) { writeString8(p, "/c"); }, "reloadConfig",
         "reloadConfig(/c)", nothing},
        {"reloadConfigWithEmptyPath", 12, [](Parcel& p) { writeString8(p, ""); }, "reloadConfig",
         "reloadConfig()", nothing},
        {"setRecordParameter", 13, [](Parcel& p) { p.writeInt32(1); }, "setRecordParameter",
         "setRecordParameter(1)", nothing},
        {"getProperties", 14, nothing, "getProperties", "getProperties",
         [](Parcel& p) { writeString8(p, R"({"p":1})"); }},
        {"getAFEParamsAsMap", 15, nothing, "getAFEParams", "getAFEParams(map)",
         [](Parcel& p) { writeString8(p, R"({"gain":2})"); }},
        {"setAFEParams", 16, [](Parcel& p) { writeString8(p, R"({"a":1})"); }, "setAFEParams",
         R"(setAFEParams({"a":1}))", nothing},
        {"getAFEParamsAsArray", 17, nothing, "getAFEParams", "getAFEParams(array)",
         [](Parcel& p) { writeString8(p, R"([3,"x"])"); }},
        {"saveConfigWithoutPath", 18, nothing, "saveConfig", "saveConfig(null)", nothing},
        {"saveConfigWithPath", 19, [](Parcel& p) { writeString8(p, "/c"); }, "saveConfig",
         "saveConfig(/c)", nothing},
        {"setConfigParamsBinary", 21,
         [](Parcel& p) {
             p.writeInt32(5);
             p.write("12345", 5);
         },
         "setConfigParams", "setConfigParams(binary)", nothing},
        {"inspect", 23, nothing, "inspect", "inspect", [](Parcel& p) { p.writeInt32(-2); }},
        {"getConfigParamsAsMap", 24, [](Parcel& p) { writeString8(p, R"({"wanted":0})"); },
         "getConfigParams", R"(getConfigParams({"wanted":0}))",
         [](Parcel& p) { writeString8(p, R"({"found":4,"wanted":0})"); }},
        {"sendCommand", 25, [](Parcel& p) { writeString8(p, R"({"ask":4})"); }, "sendCommand",
         R"(sendCommand({"ask":4}))", [](Parcel& p) { writeString8(p, R"({"answer":5})"); }},
        {"saveSession", 26, nothing, "saveSession", "saveSession",
         [](Parcel& p) { p.writeInt32(41); }},
        {"restoreSession", 27, [](Parcel& p) { p.writeInt32(41); }, "restoreSession",
         "restoreSession(41)", nothing},
        {"setAuth", 28, [](Parcel& p) { writeString8(p, "secret"); }, "setAuth", "setAuth(secret)",
         nothing},
};

class TouchCompanionStubRow : public TouchCompanionStub,
                              public ::testing::WithParamInterface<StubRow> {};

INSTANTIATE_TEST_SUITE_P(EveryTransaction, TouchCompanionStubRow, ::testing::ValuesIn(kStubRows),
                         [](const auto& info) { return info.param.name; });

TEST_P(TouchCompanionStubRow, CallsTheOperationAndRepliesWithItsStatus) {
    // The results follow whatever the status is.
    for (int status : {0, STATUS_INVALID_STATE, -1}) {
        mService->setStatus(GetParam().operation, status);
        mService->clearCalls();
        mReply.freeData();
        EXPECT_EQ(android::NO_ERROR, transact(GetParam().code, GetParam().arguments));
        EXPECT_THAT(mService->calls(), ElementsAre(GetParam().call));
        EXPECT_EQ(parcelBytes([&](Parcel& expected) {
                      expected.writeInt32(status);
                      GetParam().results(expected);
                  }),
                  reply());
    }
}

TEST_P(TouchCompanionStubRow, AnswersACallerThatWantsNoReply) {
    Parcel data;
    writeToken(data, kDescriptor);
    GetParam().arguments(data);
    EXPECT_EQ(android::NO_ERROR, mService->transact(GetParam().code, data, nullptr));
    EXPECT_THAT(mService->calls(), ElementsAre(GetParam().call));
}

// ---- the token and the range of codes ----

TEST_F(TouchCompanionStub, RefusesEveryRequestWithoutTheToken) {
    std::set<uint32_t> codes = {0,
                                kLastCode + 1,
                                IBinder::LAST_CALL_TRANSACTION,
                                IBinder::INTERFACE_TRANSACTION,
                                IBinder::DUMP_TRANSACTION,
                                IBinder::SYSPROPS_TRANSACTION,
                                IBinder::SHELL_COMMAND_TRANSACTION};
    for (uint32_t code = 1; code <= kLastCode; ++code) {
        codes.insert(code);
    }
    for (uint32_t code : codes) {
        Parcel empty;
        EXPECT_EQ(-1, mService->transact(code, empty, &mReply)) << code;
        Parcel foreign;
        writeToken(foreign, "pemaro.TouchServiceClient");
        EXPECT_EQ(-1, mService->transact(code, foreign, &mReply)) << code;
    }
    EXPECT_THAT(reply(), IsEmpty());
    EXPECT_THAT(mService->calls(), IsEmpty());
}

TEST_F(TouchCompanionStub, LeavesOtherCodesToThePlatform) {
    for (uint32_t code : {0u, kLastCode + 1, uint32_t{IBinder::LAST_CALL_TRANSACTION}}) {
        EXPECT_EQ(android::UNKNOWN_TRANSACTION, transact(code, nothing)) << code;
        EXPECT_THAT(reply(), IsEmpty());
    }
    EXPECT_EQ(android::NO_ERROR, transact(IBinder::INTERFACE_TRANSACTION, nothing));
    EXPECT_EQ(parcelBytes([](Parcel& p) { p.writeString16(android::String16(kDescriptor)); }),
              reply());
    EXPECT_THAT(mService->calls(), IsEmpty());
}

// ---- the transactions that differ ----

TEST_F(TouchCompanionStub, HandsTheCallbackObjectOn) {
    const sp<ITouchCompanionClient> client = new BnTouchCompanionClient;
    EXPECT_EQ(android::NO_ERROR, transact(1, [&](Parcel& p) {
                  p.writeStrongBinder(android::IInterface::asBinder(client));
              }));
    EXPECT_EQ(client, mService->client);
}

TEST_F(TouchCompanionStub, ReturnsTheStatusOfUnregisteringAsTheResult) {
    for (int status : {0, STATUS_INVALID_STATE, -32}) {
        mService->setStatus("unregisterClient", status);
        EXPECT_EQ(status, transact(2, nothing));
        EXPECT_THAT(reply(), IsEmpty());
    }
    EXPECT_EQ(3u, mService->calls().size());
}

TEST_F(TouchCompanionStub, RepliesWithTheControlBlock) {
    mService->cblk = new LocalMemory(136);
    EXPECT_EQ(android::NO_ERROR, transact(4, nothing));
    EXPECT_EQ(parcelBytes([&](Parcel& p) {
                  p.writeStrongBinder(android::IInterface::asBinder(mService->cblk));
              }),
              reply());
    EXPECT_EQ(mService->cblk, android::IMemory::asInterface(mReply.readStrongBinder()));
}

TEST_F(TouchCompanionStub, FailsWithoutAControlBlock) {
    EXPECT_EQ(STATUS_ERROR_ALLOCATING_MEMORY, transact(4, nothing));
    EXPECT_THAT(reply(), IsEmpty());
    EXPECT_THAT(mService->calls(), ElementsAre("getCblk"));
}

TEST_F(TouchCompanionStub, RepliesWithThePacketSizeAsItIs) {
    for (int size : {4096, 0, -1, STATUS_INVALID_STATE}) {
        mService->packetSize = size;
        mReply.freeData();
        EXPECT_EQ(android::NO_ERROR, transact(20, nothing));
        EXPECT_EQ(parcelBytes([&](Parcel& p) { p.writeInt32(size); }), reply());
    }
}

// ---- maps that cannot be read ----

TEST_F(TouchCompanionStub, AsksForConfigurationEvenWhenTheKeysCannotBeRead) {
    EXPECT_EQ(android::NO_ERROR, transact(24, [](Parcel& p) { writeString8(p, "nonsense"); }));
    EXPECT_THAT(mService->calls(), ElementsAre("getConfigParams({})"));
    EXPECT_EQ(parcelBytes([](Parcel& p) {
                  p.writeInt32(0);
                  writeString8(p, R"({"found":4})");
              }),
              reply());
    EXPECT_THAT(linesOf(kTag), ElementsAre("D problem unserializing map after binder transact"));
}

TEST_F(TouchCompanionStub, DoesNotCheckTheOtherMaps) {
    EXPECT_EQ(android::NO_ERROR, transact(16, [](Parcel& p) { writeString8(p, "nonsense"); }));
    EXPECT_EQ(android::NO_ERROR, transact(25, [](Parcel& p) { writeString8(p, "nonsense"); }));
    EXPECT_THAT(mService->calls(), ElementsAre("setAFEParams({})", "sendCommand({})"));
    EXPECT_THAT(linesOf(kTag), IsEmpty());
}

// ---- the binary configuration, set ----

TEST_F(TouchCompanionStub, SetsTheBinaryConfiguration) {
    transact(21, [](Parcel& p) {
        p.writeInt32(5);
        p.write("\1\2\3\4\5", 5);
    });
    EXPECT_EQ((Bytes{1, 2, 3, 4, 5}), mService->receivedConfig);
    EXPECT_THAT(linesOf(kTag), ElementsAre("D allocating 5 bytes for binary config data"));
}

TEST_F(TouchCompanionStub, SetsAnEmptyBinaryConfiguration) {
    EXPECT_EQ(android::NO_ERROR, transact(21, [](Parcel& p) { p.writeInt32(0); }));
    EXPECT_THAT(mService->calls(), ElementsAre("setConfigParams(binary)"));
    EXPECT_THAT(mService->receivedConfig, IsEmpty());
    EXPECT_EQ((Bytes{0, 0, 0, 0}), reply());
}

TEST_F(TouchCompanionStub, RefusesABinaryConfigurationOfNegativeSize) {
    EXPECT_EQ(STATUS_ERROR_ALLOCATING_MEMORY, transact(21, [](Parcel& p) {
                  p.writeInt32(-1);
                  p.writeInt32(0);
              }));
    EXPECT_THAT(reply(), IsEmpty());
    EXPECT_THAT(mService->calls(), IsEmpty());
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("D allocating 18446744073709551615 bytes for binary config data",
                            "E Error! could not allocate buffer for binary config data."));
}

TEST_F(TouchCompanionStub, RefusesABinaryConfigurationThatEndsEarly) {
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, transact(21, [](Parcel& p) {
                  p.writeInt32(5);
                  p.write("1234", 4);
              }));
    EXPECT_THAT(reply(), IsEmpty());
    EXPECT_THAT(mService->calls(), IsEmpty());
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("D allocating 5 bytes for binary config data",
                            "E error onTransact SET_CONFIG_BINARY: No data available"));
}

// ---- the binary configuration, read ----

class TouchCompanionStubBinaryGet : public TouchCompanionStub {
  protected:
    void SetUp() override {
        TouchCompanionStub::SetUp();
        mService->config = {1, 2, 3, 4, 5};
    }

    status_t get(int32_t size) {
        return transact(22, [=](Parcel& p) { p.writeInt32(size); });
    }
};

TEST_F(TouchCompanionStubBinaryGet, RepliesWithLengthAndBytes) {
    for (int32_t size : {5, 6, 4096}) {
        mReply.freeData();
        EXPECT_EQ(android::NO_ERROR, get(size));
        EXPECT_EQ((Bytes{5, 0, 0, 0, 1, 2, 3, 4, 5, 0, 0, 0}), reply());
    }
    EXPECT_THAT(linesOf(kTag), IsEmpty());
}

TEST_F(TouchCompanionStubBinaryGet, AnswersASizeQueryWithTheLengthAlone) {
    EXPECT_EQ(android::NO_ERROR, get(0));
    EXPECT_EQ((Bytes{5, 0, 0, 0}), reply());
    EXPECT_THAT(mService->calls(), ElementsAre("getConfigParams(binary)"));
}

TEST_F(TouchCompanionStubBinaryGet, FailsWithoutAConfiguration) {
    mService->configLength = 0;
    for (int32_t size : {8, 0}) {
        clearLog();
        mReply.freeData();
        EXPECT_EQ(STATUS_UNKNOWN_ERROR, get(size));
        EXPECT_EQ((Bytes{0, 0, 0, 0}), reply());
        EXPECT_THAT(linesOf(kTag), ElementsAre("E Error in getConfigParams (binary)!"));
    }
}

TEST_F(TouchCompanionStubBinaryGet, FailsAfterTheLengthWhenTheBufferIsTooSmall) {
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, get(4));
    EXPECT_EQ((Bytes{5, 0, 0, 0}), reply());
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("E Error! binary data size is larger than provided buffer."));
}

TEST_F(TouchCompanionStubBinaryGet, FailsForANegativeSize) {
    EXPECT_EQ(STATUS_ERROR_ALLOCATING_MEMORY, get(-1));
    EXPECT_THAT(reply(), IsEmpty());
    EXPECT_THAT(mService->calls(), IsEmpty());
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("E Error! could not allocate buffer for binary config data."));
}

// ---- requests that are not whole ----

// Missing numbers are read as 0 and missing texts as empty, and no byte beyond the request is looked at.
TEST_F(TouchCompanionStub, SurvivesMalformedRequests) {
    const Bytes kArguments[] = {
            {},
            {1},
            {1, 0, 0},
            {0xff, 0xff, 0xff, 0xff},
            {0xff, 0xff, 0xff, 0x7f},
            {8, 0, 0, 0, '{', '"', 'a'},
            {3, 0, 0, 0, 'a', 'b', 'c'},
            {0, 0, 0, 0x80, 0, 0, 0, 0},
            Bytes(64, 0xff),
            Bytes(64, 0x85),
    };
    Parcel token;
    writeToken(token, kDescriptor);
    for (const Bytes& arguments : kArguments) {
        Bytes request = bytesOf(token);
        request.insert(request.end(), arguments.begin(), arguments.end());
        for (uint32_t code = 1; code <= kLastCode; ++code) {
            Parcel data;
            data.setData(request.data(), request.size());
            Parcel answer;
            mService->transact(code, data, &answer);
        }
    }
    EXPECT_EQ(nullptr, mService->client);
}

TEST_F(TouchCompanionStub, TakesMissingArgumentsForZeroAndEmpty) {
    for (uint32_t code : {8u, 9u, 12u, 13u, 16u, 19u, 25u, 27u, 28u}) {
        EXPECT_EQ(android::NO_ERROR, transact(code, nothing)) << code;
    }
    EXPECT_THAT(mService->calls(),
                ElementsAre("setRecordFile()", "sendEvent(0,0)", "reloadConfig()",
                            "setRecordParameter(0)", "setAFEParams({})", "saveConfig()",
                            "sendCommand({})", "restoreSession(0)", "setAuth()"));
}

}  // namespace
}  // namespace pemaro::test
