// SPDX-License-Identifier: Apache-2.0
// The proxy of the touch companion service: for each operation the request that it sends, what it logs, and
// what it makes of every kind of answer.

#include "pemaro/BpTouchCompanionService.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <climits>
#include <cstdio>
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
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::Parcel;
using android::sp;
using ::testing::ElementsAre;

SerializableMap mapOf(const std::string& key, int value) {
    SerializableMap map;
    map.add(key, value);
    return map;
}

// What stands for a callback object in a request; the same for all rows, so that its bytes are.
const sp<ITouchCompanionClient>& callbackObject() {
    static const sp<ITouchCompanionClient> object = new BnTouchCompanionClient;
    return object;
}

struct ProxyRow {
    const char* name;
    uint32_t code;
    int (*call)(ITouchCompanionService& service);
    void (*arguments)(Parcel& request);        // what follows the token
    const char* entry;                         // null: no entry line
    const char* transportError;                // null: a failure is not logged
    const char* remoteError;                   // null: no status is read, or it is not logged
    bool passesStatus = true;                  // whether the remote status becomes the result
    void (*results)(Parcel& reply) = nullptr;  // what follows a status of 0 in the reply
    const char* resultLine = nullptr;
};

void mapText(Parcel& parcel) {
    writeString8(parcel, R"({"a":1})");
}

const ProxyRow kProxyRows[] = {
        {"registerClient", 1, [](auto& s) { return s.registerClient(callbackObject()); },
         [](Parcel& p) { p.writeStrongBinder(android::IInterface::asBinder(callbackObject())); },
         "Bp::registerClient", "registerClient() error: %s", nullptr, false},
        {"unregisterClient", 2, [](auto& s) { return s.unregisterClient(); }, nothing,
         "Bp: unregisterClient", "unregisterClient() error: %s", nullptr, false},
        {"open", 3, [](auto& s) { return s.open(); }, nothing, "Bp::open", "init() error: %s",
         "init() error: %s"},
        {"prepareRecord", 5, [](auto& s) { return s.prepareRecord(); }, nothing,
         "Bp::prepareRecord", "prepareRecord() error: %s", nullptr, false},
        {"startRecord", 6, [](auto& s) { return s.startRecord(); }, nothing, "Bp::startRecord",
         "startRecord() error: %s", "startRecord() error: %s"},
        {"stopRecord", 7, [](auto& s) { return s.stopRecord(); }, nothing, "Bp::stopRecord",
         "stopRecord() error: %s", "stopRecord() error: %s"},
        {"setRecordFile", 8, [](auto& s) { return s.setRecordFile("/data/frames.bin"); },
         [](Parcel& p) { writeString8(p, "/data/frames.bin"); }, nullptr,
         "setRecordFile() error: %s", "setRecordFile() error: %s"},
        {"sendEvent", 9, [](auto& s) { return s.sendEvent(7, -8); },
         [](Parcel& p) {
             p.writeInt32(7);
             p.writeInt32(-8);
         },
         "Bp::sendEvent", "sendEvent() error: %s", "reloadConfig() error: %s"},
        {"close", 10, [](auto& s) { return s.close(); }, nothing, "Bp::close", "init() error: %s",
         "close() error: %s"},
        {"reloadConfigWithoutPath", 11, [](auto& s) { return s.reloadConfig(nullptr); }, nothing,
         "Bp::reloadConfig", "reloadConfig() error: %s", "reloadConfig() error: %s"},
        {"reloadConfigWithPath", 12,
         [](auto& s) {
             const std::string path = "/etc/touch.xml";
             return s.reloadConfig(&path);
         },
         [](Parcel& p) { writeString8(p, "/etc/touch.xml"); }, "Bp::reloadConfig",
         "reloadConfig() error: %s", "reloadConfig() error: %s"},
        {"reloadConfigWithEmptyPath", 12,
         [](auto& s) {
             const std::string path;
             return s.reloadConfig(&path);
         },
         [](Parcel& p) { writeString8(p, ""); }, "Bp::reloadConfig", "reloadConfig() error: %s",
         "reloadConfig() error: %s"},
        {"setRecordParameter", 13, [](auto& s) { return s.setRecordParameter(1); },
         [](Parcel& p) { p.writeInt32(1); }, "Bp::setRecordParameter",
         "setRecordParameter() error: %s", "setRecordOutput() error: %s"},
        {"getProperties", 14,
         [](auto& s) {
             SerializableMap out;
             return s.getProperties(out);
         },
         nothing, "Bp::getProperties", "getProperties() error: %s", "getProperties() error: %s",
         true, mapText},
        {"getAFEParamsAsMap", 15,
         [](auto& s) {
             SerializableMap out;
             return s.getAFEParams(out);
         },
         nothing, "Bp::getAFEParams", "getAFEParams() error: %s", "getAFEParams() error: %s", true,
         mapText},
        {"setAFEParams", 16,
         [](auto& s) {
             SerializableMap params = mapOf("gain", 3);
             return s.setAFEParams(params);
         },
         [](Parcel& p) { writeString8(p, R"({"gain":3})"); }, "Bp::setAFEParams",
         "setAFEParams() error: %s", "setAFEParams() error: %s"},
        {"getAFEParamsAsArray", 17,
         [](auto& s) {
             SerializableMapArray out;
             return s.getAFEParams(out);
         },
         nothing, "Bp::getAFEParams", "getAFEParams() error: %s", "getAFEParams() error: %s", true,
         [](Parcel& p) { writeString8(p, "[1,2]"); }},
        {"saveConfigWithoutPath", 18, [](auto& s) { return s.saveConfig(nullptr); }, nothing,
         "Bp::saveConfig", "saveConfig() error: %s", "saveConfig() error: %s"},
        {"saveConfigWithPath", 19,
         [](auto& s) {
             const std::string path = "/etc/touch.xml";
             return s.saveConfig(&path);
         },
         [](Parcel& p) { writeString8(p, "/etc/touch.xml"); }, "Bp::saveConfig",
         "saveConfig() error: %s", "saveConfig() error: %s"},
        {"getPacketSize", 20, [](auto& s) { return s.getPacketSize(); }, nothing,
         "Bp::getPacketSize", "getPacketSize() error: %s", nullptr},
        {"setConfigParamsBinary", 21, [](auto& s) { return s.setConfigParams("12345", 5); },
         [](Parcel& p) {
             p.writeInt32(5);
             p.write("12345", 5);
         },
         "Bp::setConfigParams(binary)", "setConfigParams() (binary) error: %s",
         "setConfigParams() (binary) error: %s"},
        {"inspect", 23,
         [](auto& s) {
             unsigned int value;
             return s.inspect(&value);
         },
         nothing, "Bp::inspect", "inspect() error: %s", "inspect() error: %s", true,
         [](Parcel& p) { p.writeInt32(1); }},
        {"getConfigParamsAsMap", 24,
         [](auto& s) {
             SerializableMap params = mapOf("wanted", 0);
             return s.getConfigParams(params);
         },
         [](Parcel& p) { writeString8(p, R"({"wanted":0})"); }, "Bp::getConfigParams",
         "getConfigParams() transact error: %s", "getConfigParams() reply error: %s", true,
         mapText},
        {"sendCommand", 25,
         [](auto& s) {
             SerializableMap request = mapOf("ask", 4);
             SerializableMap response;
             return s.sendCommand(request, response);
         },
         [](Parcel& p) { writeString8(p, R"({"ask":4})"); }, "Bp::sendCommand",
         "sendCommand() error: %s", "sendCommand() error1: %s", true, mapText},
        {"saveSession", 26,
         [](auto& s) {
             int id;
             return s.saveSession(id);
         },
         nothing, "Bp::saveSession", "saveSession() error: %s", "saveSession() error: %s", true,
         [](Parcel& p) { p.writeInt32(41); }, "D saveSession() sessionID: 41"},
        {"restoreSession", 27, [](auto& s) { return s.restoreSession(41); },
         [](Parcel& p) { p.writeInt32(41); }, "Bp::restoreSession", "restoreSession() error: %s",
         "restoreSession() error: %s"},
        {"setAuth", 28, [](auto& s) { return s.setAuth("secret"); },
         [](Parcel& p) { writeString8(p, "secret"); }, nullptr, nullptr, nullptr},
};

std::string nameOf(const ::testing::TestParamInfo<ProxyRow>& info) {
    return info.param.name;
}

std::string formatted(const char* format, const char* argument) {
    char text[200];
    snprintf(text, sizeof(text), format, argument);
    return text;
}

class TouchCompanionProxy : public ::testing::Test {
  protected:
    void SetUp() override { clearLog(); }

    const sp<RecordingBinder> mRemote = new RecordingBinder;
    const sp<ITouchCompanionService> mProxy = ITouchCompanionService::asInterface(mRemote);
};

class TouchCompanionProxyRow : public TouchCompanionProxy,
                               public ::testing::WithParamInterface<ProxyRow> {
  protected:
    static Lines entryLine() {
        const char* entry = GetParam().entry;
        return entry == nullptr ? Lines{} : Lines{std::string("D ") + entry};
    }

    // The entry, and the error with its reason where the row has a text for it.
    static Lines failureLines(const char* format, const char* reason) {
        Lines lines = entryLine();
        if (format != nullptr) {
            lines.push_back("E " + formatted(format, reason));
        }
        return lines;
    }
};

INSTANTIATE_TEST_SUITE_P(EveryOperation, TouchCompanionProxyRow, ::testing::ValuesIn(kProxyRows),
                         nameOf);

TEST_P(TouchCompanionProxyRow, SendsItsRequestAndReturnsSuccess) {
    mRemote->answer([](Parcel& reply) {
        reply.writeInt32(0);
        if (GetParam().results) {
            GetParam().results(reply);
        }
    });
    EXPECT_EQ(0, GetParam().call(*mProxy));

    ASSERT_EQ(1u, mRemote->transactions().size());
    const RecordingBinder::Transaction sent = mRemote->lastTransaction();
    EXPECT_EQ(GetParam().code, sent.code);
    EXPECT_EQ(0u, sent.flags) << "calls are synchronous";
    EXPECT_EQ(requestBytes(kDescriptor, GetParam().arguments), sent.request);

    Lines lines = entryLine();
    if (GetParam().resultLine != nullptr) {
        lines.push_back(GetParam().resultLine);
    }
    EXPECT_EQ(lines, linesOf(kTag));
}

TEST_P(TouchCompanionProxyRow, TurnsATransportFailureIntoTheUnknownError) {
    // The last two are what a stub returns as the result of a transaction, and a platform status that is no
    // errno.
    for (android::status_t failure : {-EPIPE, -EPERM, -ENODATA, 0x4000000A, INT_MIN}) {
        clearLog();
        // A status in the reply must not be looked at.
        mRemote->answer([](Parcel& reply) { reply.writeInt32(STATUS_INVALID_COMMAND); }, failure);
        EXPECT_EQ(STATUS_UNKNOWN_ERROR, GetParam().call(*mProxy));
        const int number = static_cast<int>(-static_cast<int64_t>(failure));
        const std::string reason = strerror(number);
        EXPECT_EQ(failureLines(GetParam().transportError, reason.c_str()), linesOf(kTag));
    }
}

TEST_P(TouchCompanionProxyRow, PassesTheRemoteStatusOnUnchanged) {
    for (int status : {STATUS_INVALID_COMMAND, STATUS_CORRUPT_DATA, 77, -1}) {
        clearLog();
        mRemote->answer([=](Parcel& reply) {
            reply.writeInt32(status);
            if (GetParam().results) {
                GetParam().results(reply);
            }
        });
        EXPECT_EQ(GetParam().passesStatus ? status : 0, GetParam().call(*mProxy));
        EXPECT_EQ(failureLines(GetParam().remoteError, errStr(status)), linesOf(kTag));
    }
}

// A reply that ends early, or tells of more than it holds, is read as zeros and empty texts.
TEST_P(TouchCompanionProxyRow, SurvivesMalformedReplies) {
    const Bytes kReplies[] = {
            {},
            {0, 0, 0},
            {0, 0, 0, 0},
            {0, 0, 0, 0, 1, 2, 3},
            {0, 0, 0, 0, 0xff, 0xff, 0xff, 0xff},
            {0, 0, 0, 0, 0xff, 0xff, 0xff, 0x7f, '{', '"', 'a', '"'},
            {0, 0, 0, 0, 8, 0, 0, 0, '{', '"', 'a', '"'},
    };
    const std::set<uint32_t> kTextReplies = {14, 15, 17, 24, 25};
    const bool readsText = kTextReplies.count(GetParam().code) != 0;
    for (const Bytes& bytes : kReplies) {
        mRemote->answer([&](Parcel& reply) { reply.setData(bytes.data(), bytes.size()); });
        EXPECT_EQ(readsText ? STATUS_INVALID_FORMAT : 0, GetParam().call(*mProxy));
    }
}

// ---- results ----

TEST_F(TouchCompanionProxy, ReadsMapsOnSuccess) {
    mRemote->answer([](Parcel& reply) {
        reply.writeInt32(0);
        writeString8(reply, R"({"a":1,"b":"x"})");
    });
    SerializableMap properties = mapOf("old", 9);
    EXPECT_EQ(0, mProxy->getProperties(properties));
    EXPECT_EQ(R"({"a":1,"b":"x"})", properties.serialize());

    SerializableMap afe;
    EXPECT_EQ(0, mProxy->getAFEParams(afe));
    EXPECT_EQ(R"({"a":1,"b":"x"})", afe.serialize());

    SerializableMap params = mapOf("wanted", 0);
    EXPECT_EQ(0, mProxy->getConfigParams(params));
    EXPECT_EQ(R"({"a":1,"b":"x"})", params.serialize()) << "the reply replaces the request";

    SerializableMap request = mapOf("ask", 4);
    SerializableMap response;
    EXPECT_EQ(0, mProxy->sendCommand(request, response));
    EXPECT_EQ(R"({"a":1,"b":"x"})", response.serialize());
    EXPECT_EQ(R"({"ask":4})", request.serialize());
}

TEST_F(TouchCompanionProxy, ReadsTheArray) {
    mRemote->answer([](Parcel& reply) {
        reply.writeInt32(0);
        writeString8(reply, R"([1,{"a":2},"x"])");
    });
    SerializableMapArray array;
    EXPECT_EQ(0, mProxy->getAFEParams(array));
    EXPECT_EQ(R"([1,{"a":2},"x"])", array.serialize());
}

TEST_F(TouchCompanionProxy, LeavesOutputsAloneOnFailure) {
    for (bool transportFails : {true, false}) {
        mRemote->answer(
                [](Parcel& reply) {
                    reply.writeInt32(STATUS_INVALID_STATE);
                    writeString8(reply, R"({"a":1})");
                },
                transportFails ? -EPIPE : 0);
        SerializableMap map = mapOf("old", 9);
        mProxy->getProperties(map);
        mProxy->getAFEParams(map);
        mProxy->getConfigParams(map);
        SerializableMap request;
        mProxy->sendCommand(request, map);
        EXPECT_EQ(R"({"old":9})", map.serialize());

        SerializableMapArray array;
        array.add(5);
        mProxy->getAFEParams(array);
        EXPECT_EQ("[5]", array.serialize());

        unsigned int value = 6;
        mProxy->inspect(&value);
        EXPECT_EQ(6u, value);
        int session = 7;
        mProxy->saveSession(session);
        EXPECT_EQ(7, session);
    }
}

struct ParseRow {
    const char* name;
    int (*call)(ITouchCompanionService& service);
    Lines lines;
};

const ParseRow kParseRows[] = {
        {"getProperties",
         [](auto& s) {
             SerializableMap out;
             return s.getProperties(out);
         },
         {"D Bp::getProperties", "E getProperties() error: Invalid format"}},
        {"getAFEParamsAsMap",
         [](auto& s) {
             SerializableMap out;
             return s.getAFEParams(out);
         },
         {"D Bp::getAFEParams", "E getAFEParams() error: Invalid format"}},
        {"getAFEParamsAsArray",
         [](auto& s) {
             SerializableMapArray out;
             return s.getAFEParams(out);
         },
         {"D Bp::getAFEParams", "E getAFEParams() error: Invalid format"}},
        {"getConfigParamsAsMap",
         [](auto& s) {
             SerializableMap params;
             return s.getConfigParams(params);
         },
         {"D Bp::getConfigParams", "E getConfigParams() unserialize error: Invalid format",
          "E string: nonsense"}},
        {"sendCommand",
         [](auto& s) {
             SerializableMap request;
             SerializableMap response;
             return s.sendCommand(request, response);
         },
         {"D Bp::sendCommand", "E sendCommand() error2: Invalid format"}},
};

class TouchCompanionProxyText : public TouchCompanionProxy,
                                public ::testing::WithParamInterface<ParseRow> {};

INSTANTIATE_TEST_SUITE_P(EveryTextReply, TouchCompanionProxyText, ::testing::ValuesIn(kParseRows),
                         [](const auto& info) { return info.param.name; });

TEST_P(TouchCompanionProxyText, ReportsATextThatCannotBeRead) {
    mRemote->answer([](Parcel& reply) {
        reply.writeInt32(0);
        writeString8(reply, "nonsense");
    });
    EXPECT_EQ(STATUS_INVALID_FORMAT, GetParam().call(*mProxy));
    EXPECT_EQ(GetParam().lines, linesOf(kTag));
}

TEST_F(TouchCompanionProxy, ReadsNumbers) {
    mRemote->answer([](Parcel& reply) {
        reply.writeInt32(0);
        reply.writeInt32(-2);
    });
    unsigned int value = 0;
    EXPECT_EQ(0, mProxy->inspect(&value));
    EXPECT_EQ(0xfffffffeu, value);
    int session = 0;
    EXPECT_EQ(0, mProxy->saveSession(session));
    EXPECT_EQ(-2, session);

    mRemote->answer([](Parcel& reply) { reply.writeInt32(4096); });
    EXPECT_EQ(4096, mProxy->getPacketSize());
}

TEST_F(TouchCompanionProxy, RegistersANullClient) {
    mRemote->answer([](Parcel& reply) { reply.writeInt32(0); });
    EXPECT_EQ(0, mProxy->registerClient(nullptr));
    EXPECT_EQ(requestBytes(kDescriptor, [](Parcel& p) { p.writeStrongBinder(nullptr); }),
              mRemote->lastTransaction().request);
}

TEST_F(TouchCompanionProxy, SendsTextsWithAllTheirBytes) {
    const std::string path("a\0b", 3);
    mRemote->answer([](Parcel& reply) { reply.writeInt32(0); });
    EXPECT_EQ(0, mProxy->setRecordFile(path));
    EXPECT_EQ(requestBytes(kDescriptor,
                           [&](Parcel& p) {
                               p.writeInt32(3);
                               p.write("a\0b", 4);
                           }),
              mRemote->lastTransaction().request);
}

// ---- the control block ----

TEST_F(TouchCompanionProxy, ReadsTheControlBlock) {
    const sp<android::IMemory> block = new LocalMemory(136);
    mRemote->answer(
            [&](Parcel& reply) { reply.writeStrongBinder(android::IInterface::asBinder(block)); });
    EXPECT_EQ(block, mProxy->getCblk());
    EXPECT_EQ(4u, mRemote->lastTransaction().code);
    EXPECT_EQ(0u, mRemote->lastTransaction().flags);
    EXPECT_EQ(requestBytes(kDescriptor), mRemote->lastTransaction().request);
    EXPECT_THAT(linesOf(kTag), ElementsAre("D Bp::getCblk"));
}

TEST_F(TouchCompanionProxy, HasNoControlBlockWhenTheTransactionFails) {
    mRemote->fail(-EPIPE);
    EXPECT_EQ(nullptr, mProxy->getCblk());
    EXPECT_THAT(linesOf(kTag), ElementsAre("D Bp::getCblk", "E getCblk() error: Broken pipe"));
}

TEST_F(TouchCompanionProxy, HasNoControlBlockInAReplyWithoutABinder) {
    for (const Bytes& bytes : {Bytes{}, Bytes{1, 2, 3}, Bytes(64, 0x85)}) {
        mRemote->answer([&](Parcel& reply) { reply.setData(bytes.data(), bytes.size()); });
        EXPECT_EQ(nullptr, mProxy->getCblk());
    }
    EXPECT_THAT(linesOf(kTag), ElementsAre("D Bp::getCblk", "D Bp::getCblk", "D Bp::getCblk"));
}

// ---- the binary configuration ----

class TouchCompanionProxyBinary : public TouchCompanionProxy {
  protected:
    // Answers with a length and the bytes 1, 2, 3 ...
    void answerLength(int32_t length, size_t bytes) {
        mRemote->answer([=](Parcel& reply) {
            reply.writeInt32(length);
            for (size_t i = 0; i < bytes; ++i) {
                mContent.push_back(static_cast<uint8_t>(i + 1));
            }
            reply.write(mContent.data(), bytes);
        });
    }

    size_t get(size_t size) { return mProxy->getConfigParams(mBuffer, size); }

    Bytes mContent;
    char mBuffer[8] = {9, 9, 9, 9, 9, 9, 9, 9};
};

TEST_F(TouchCompanionProxyBinary, ReadsTheBytes) {
    answerLength(5, 5);
    EXPECT_EQ(5u, get(sizeof(mBuffer)));
    EXPECT_THAT(mBuffer, ElementsAre(1, 2, 3, 4, 5, 9, 9, 9));
    EXPECT_EQ(22u, mRemote->lastTransaction().code);
    EXPECT_EQ(requestBytes(kDescriptor, [](Parcel& p) { p.writeInt32(8); }),
              mRemote->lastTransaction().request);
    EXPECT_THAT(linesOf(kTag), ElementsAre("D Bp::getConfigParams (binary)"));
}

TEST_F(TouchCompanionProxyBinary, FillsABufferOfExactlyThatSize) {
    answerLength(5, 5);
    EXPECT_EQ(5u, get(5));
    EXPECT_THAT(mBuffer, ElementsAre(1, 2, 3, 4, 5, 9, 9, 9));
}

TEST_F(TouchCompanionProxyBinary, YieldsZeroWhenTheTransactionFails) {
    mRemote->fail(-EPIPE);
    EXPECT_EQ(0u, get(sizeof(mBuffer)));
    EXPECT_THAT(linesOf(kTag), ElementsAre("D Bp::getConfigParams (binary)",
                                           "E getConfigParams() (binary) error: Broken pipe"));
}

TEST_F(TouchCompanionProxyBinary, YieldsZeroWhenThereIsNoConfiguration) {
    answerLength(0, 0);
    const Lines lines = {"D Bp::getConfigParams (binary)",
                         "E getConfigParams: Error! unable to get binary config params."};
    EXPECT_EQ(0u, get(sizeof(mBuffer)));
    EXPECT_EQ(lines, linesOf(kTag));
    clearLog();
    EXPECT_EQ(0u, get(0)) << "a size query is told apart only afterwards";
    EXPECT_EQ(lines, linesOf(kTag));
}

TEST_F(TouchCompanionProxyBinary, AnswersASizeQueryWithoutReading) {
    answerLength(5, 5);
    EXPECT_EQ(5u, get(0));
    EXPECT_EQ(5u, mProxy->getConfigParams(nullptr, 0));
    EXPECT_THAT(mBuffer, ElementsAre(9, 9, 9, 9, 9, 9, 9, 9));
    EXPECT_EQ(requestBytes(kDescriptor, [](Parcel& p) { p.writeInt32(0); }),
              mRemote->lastTransaction().request);
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("D Bp::getConfigParams (binary)", "D Bp::getConfigParams (binary)"));
}

TEST_F(TouchCompanionProxyBinary, ReadsNothingIntoABufferThatIsTooSmall) {
    answerLength(5, 5);
    EXPECT_EQ(5u, get(4));
    EXPECT_THAT(mBuffer, ElementsAre(9, 9, 9, 9, 9, 9, 9, 9));
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("D Bp::getConfigParams (binary)",
                            "E getConfigParams: Error! buffer must be at least 5 bytes"));
}

TEST_F(TouchCompanionProxyBinary, ReadsNothingIntoANullBuffer) {
    answerLength(5, 5);
    EXPECT_EQ(5u, mProxy->getConfigParams(nullptr, 5));
    EXPECT_THAT(linesOf(kTag), ElementsAre("D Bp::getConfigParams (binary)",
                                           "E getConfigParams: Error! buffer is null!"));
}

TEST_F(TouchCompanionProxyBinary, YieldsZeroWhenBytesAreMissing) {
    answerLength(8, 2);
    EXPECT_EQ(0u, get(8));
    EXPECT_THAT(mBuffer, ElementsAre(9, 9, 9, 9, 9, 9, 9, 9));
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("D Bp::getConfigParams (binary)",
                            "E getConfigParams() (binary) error: No data available"));
}

TEST_F(TouchCompanionProxyBinary, TakesANegativeLengthForOneThatFitsNoBuffer) {
    answerLength(-1, 4);
    EXPECT_EQ(SIZE_MAX, get(sizeof(mBuffer)));
    EXPECT_THAT(mBuffer, ElementsAre(9, 9, 9, 9, 9, 9, 9, 9));
    EXPECT_EQ(formatted("E getConfigParams: Error! buffer must be at least %s bytes",
                        std::to_string(SIZE_MAX).c_str()),
              linesOf(kTag).back());
}

// ---- proxy and stub together ----

class TouchCompanionProxyAndStub : public TouchCompanionProxy {
  protected:
    void SetUp() override {
        mRemote->forwardTo(mService);
        TouchCompanionProxy::SetUp();
    }

    const sp<FakeTouchCompanionService> mService = new FakeTouchCompanionService;
};

TEST_F(TouchCompanionProxyAndStub, RegistersAClientThatTheServiceRefuses) {
    mService->setStatus("registerClient", STATUS_INVALID_STATE);
    EXPECT_EQ(0, mProxy->registerClient(callbackObject()));
    EXPECT_EQ(callbackObject(), mService->client);
    EXPECT_THAT(linesOf(kTag), ElementsAre("D Bp::registerClient"));
}

TEST_F(TouchCompanionProxyAndStub, SeesARefusedUnregistrationAsAFailedTransaction) {
    mService->setStatus("unregisterClient", STATUS_INVALID_STATE);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, mProxy->unregisterClient());
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("D Bp: unregisterClient",
                            "E unregisterClient() error: " + std::string(strerror(-0x4000000B))));
}

TEST_F(TouchCompanionProxyAndStub, SeesAMissingControlBlockAsAFailedTransaction) {
    EXPECT_EQ(nullptr, mProxy->getCblk());
    EXPECT_THAT(linesOf(kTag),
                ElementsAre("D Bp::getCblk",
                            "E getCblk() error: " + std::string(strerror(-0x40000006))));
}

TEST_F(TouchCompanionProxyAndStub, CarriesTheBinaryConfigurationBothWays) {
    mService->config = {1, 2, 3, 4, 5};
    const size_t size = mProxy->getConfigParams(nullptr, 0);
    ASSERT_EQ(5u, size);
    Bytes config(size);
    EXPECT_EQ(5u, mProxy->getConfigParams(config.data(), size));
    EXPECT_EQ(mService->config, config);

    EXPECT_EQ(0, mProxy->setConfigParams(config.data(), config.size()));
    EXPECT_EQ(config, mService->receivedConfig);
}

// The first is more than a length on the wire can tell, the second more than a parcel holds.
TEST_F(TouchCompanionProxyAndStub, RefusesABinaryConfigurationThatCannotBeSent) {
    const char first = 0;  // nothing of it is read
    for (size_t size : {size_t{INT32_MAX} + 1, size_t{INT32_MAX}, SIZE_MAX}) {
        clearLog();
        EXPECT_EQ(STATUS_DATA_EXCEEDS_BUFFER, mProxy->setConfigParams(&first, size)) << size;
        EXPECT_THAT(linesOf(kTag),
                    ElementsAre("D Bp::setConfigParams(binary)",
                                "E setConfigParams() (binary) error: Data size exceeds size of "
                                "buffer"));
    }
    EXPECT_THAT(mService->calls(), ::testing::IsEmpty());
}

TEST_F(TouchCompanionProxyAndStub, YieldsZeroForABinaryConfigurationThatDoesNotFit) {
    mService->config = {1, 2, 3, 4, 5};
    Bytes config(4);
    EXPECT_EQ(0u, mProxy->getConfigParams(config.data(), config.size()));
    EXPECT_EQ(Bytes(4), config);
    EXPECT_THAT(linesOf(kTag), ElementsAre("D Bp::getConfigParams (binary)",
                                           "E Error! binary data size is larger than provided "
                                           "buffer.",
                                           "E getConfigParams() (binary) error: " +
                                                   std::string(strerror(-0x4000000A))));
}

TEST_F(TouchCompanionProxyAndStub, TellsAnEmptyPathFromNone) {
    const std::string empty;
    EXPECT_EQ(0, mProxy->reloadConfig(nullptr));
    EXPECT_EQ(0, mProxy->reloadConfig(&empty));
    EXPECT_EQ(0, mProxy->saveConfig(nullptr));
    EXPECT_EQ(0, mProxy->saveConfig(&empty));
    EXPECT_THAT(mService->calls(), ElementsAre("reloadConfig(null)", "reloadConfig()",
                                               "saveConfig(null)", "saveConfig()"));
}

}  // namespace
}  // namespace pemaro::test
