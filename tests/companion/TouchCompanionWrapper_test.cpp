// SPDX-License-Identifier: Apache-2.0
// The companion facades, as a caller has them: made by the factory, reached through their positions
// in the table of virtual functions.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>

#include "pemaro/ITouchCompanionFacade.h"
#include "pemaro/ITouchCompanionFacadeOld.h"
#include "tests/companion/FactoryObject.h"
#include "tests/companion/TouchCompanionRemoteTest.h"
#include "tests/support/VirtualSlot.h"

namespace pemaro::test {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

using Facade = ITouchCompanionFacade;
using FacadeOld = ITouchCompanionFacadeOld;
using DataCallback = void (*)(int, void*, unsigned long, void*);

constexpr char kFacadeTag[] = "SerializableMap";

// The operations that both facades have, by position. The destructor takes two slots, so position n,
// the destructor being the first, is slot n.
template <typename Interface>
class Caller {
  public:
    static constexpr bool kIsCurrent = std::is_same_v<Interface, Facade>;
    static constexpr int kClassID = kIsCurrent ? 2048 : 1792;
    static constexpr int kGetPacketSize = kIsCurrent ? 11 : 12;
    static constexpr int kInspect = kIsCurrent ? 12 : 13;

    int getClassID() { return call<int (Interface::*)()>(2); }
    int init(DataCallback callback = nullptr, void* context = nullptr) {
        return call<int (Interface::*)(DataCallback, void*)>(3, callback, context);
    }
    int setRecordOutput(int output) { return call<int (Interface::*)(int)>(4, output); }
    int startRecord() { return call<int (Interface::*)()>(5); }
    int stopRecord() { return call<int (Interface::*)()>(6); }
    int getConfigParams(ISerializableParams4* params) {
        return call<int (Interface::*)(ISerializableParams4*)>(7, params);
    }
    int setConfigParams(ISerializableParams4* params) {
        return call<int (Interface::*)(ISerializableParams4*)>(8, params);
    }
    int getConfigParams(void* buffer, unsigned long* len) {
        return call<int (Interface::*)(void*, unsigned long*)>(9, buffer, len);
    }
    int setConfigParams(const void* data, unsigned long size) {
        return call<int (Interface::*)(const void*, unsigned long)>(10, data, size);
    }
    int getPacketSize() { return call<int (Interface::*)()>(kGetPacketSize); }
    int inspect(unsigned int* value) {
        return call<int (Interface::*)(unsigned int*)>(kInspect, value);
    }

    // The current facade's own.
    int setRecordFilter(unsigned int mask) {
        return call<int (Interface::*)(unsigned int)>(13, mask);
    }
    int sendCommand(const char* command, char** result) {
        return call<int (Interface::*)(const char*, char**)>(14, command, result);
    }

    // The older facade's own.
    int getFormatDescription(std::string& first, std::string& second) {
        return call<int (Interface::*)(std::string&, std::string&)>(11, first, second);
    }

    // Destroys the object and releases its memory.
    void destroy() { (mObject.release()->*memberAt<void (Interface::*)()>(1))(); }

  private:
    template <typename Member, typename... Arguments>
    int call(int slot, Arguments... arguments) {
        return ((*mObject).*memberAt<Member>(slot))(arguments...);
    }

    std::unique_ptr<Interface> mObject = make<Interface>(kClassID);
};

template <typename Interface>
class CompanionFacade : public TouchCompanionRemoteTest {
  protected:
    // Connected, with the calls and lines of that forgotten.
    void connectFacade(DataCallback callback = nullptr, void* context = nullptr) {
        ASSERT_EQ(0, mFacade.init(callback, context));
        forget();
        mRemote->clearTransactions();
    }

    std::string onlyCall() {
        EXPECT_EQ(1u, mService->calls().size());
        const std::string call = mService->calls().empty() ? "" : mService->calls().back();
        mService->clearCalls();
        return call;
    }

    Caller<Interface> mFacade;
};

using Interfaces = ::testing::Types<Facade, FacadeOld>;
TYPED_TEST_SUITE(CompanionFacade, Interfaces);

// ---- both facades ----

TYPED_TEST(CompanionFacade, KnowsItsClass) {
    EXPECT_EQ(TestFixture::mFacade.kClassID, this->mFacade.getClassID());
}

TYPED_TEST(CompanionFacade, HandsEachOperationToTheClient) {
    this->connectFacade();
    EXPECT_EQ(0, this->mFacade.setRecordOutput(0));
    EXPECT_EQ("setRecordParameter(0)", this->onlyCall());
    EXPECT_EQ(0, this->mFacade.startRecord());
    EXPECT_THAT(this->mService->calls(), ElementsAre("prepareRecord", "startRecord"));
    this->mService->clearCalls();
    EXPECT_EQ(0, this->mFacade.stopRecord());
    EXPECT_EQ("stopRecord", this->onlyCall());
    EXPECT_EQ(0, this->mFacade.setConfigParams("abc", 3ul));
    EXPECT_EQ("setConfigParams(binary)", this->onlyCall());
    EXPECT_EQ((Bytes{'a', 'b', 'c'}), this->mService->receivedConfig);
    this->mService->packetSize = 512;
    EXPECT_EQ(512, this->mFacade.getPacketSize());
    EXPECT_EQ("getPacketSize", this->onlyCall());
    this->mService->inspection = 77;
    unsigned int inspected = 0;
    EXPECT_EQ(0, this->mFacade.inspect(&inspected));
    EXPECT_EQ(77u, inspected);
    EXPECT_EQ("inspect", this->onlyCall());
    this->mService->config = {1, 2, 3};
    uint8_t buffer[4] = {};
    unsigned long length = sizeof(buffer);
    EXPECT_EQ(0, this->mFacade.getConfigParams(buffer, &length));
    EXPECT_EQ(3u, length);
    EXPECT_EQ(3, buffer[2]);
    EXPECT_EQ("getConfigParams(binary)", this->onlyCall());
}

TYPED_TEST(CompanionFacade, PassesTheClientsStatusOn) {
    this->connectFacade();
    EXPECT_EQ(0x4000000D, this->mFacade.startRecord());
    uint8_t byte = 0;
    EXPECT_EQ(0x4000001B, this->mFacade.getConfigParams(&byte, nullptr));
    this->mService->setStatus("setRecordParameter", STATUS_UNSUPPORTED);
    EXPECT_EQ(STATUS_UNSUPPORTED, this->mFacade.setRecordOutput(7));
    this->mService->setStatus("stopRecord", STATUS_BROKEN_PIPE);
    EXPECT_EQ(STATUS_BROKEN_PIPE, this->mFacade.stopRecord());
    this->mService->setStatus("setConfigParams", STATUS_CORRUPT_DATA);
    EXPECT_EQ(STATUS_CORRUPT_DATA, this->mFacade.setConfigParams("", 0ul));
    this->mService->setStatus("inspect", STATUS_NOT_FOUND);
    unsigned int inspected = 0;
    EXPECT_EQ(STATUS_NOT_FOUND, this->mFacade.inspect(&inspected));
    this->mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(0x40000000, this->mFacade.getPacketSize());
}

TYPED_TEST(CompanionFacade, DeliversRecordedFrames) {
    FrameRing ring(8, 64);
    this->mService->cblk = ring.memory();
    Frames frames;
    this->connectFacade(Frames::callback, &frames);
    EXPECT_EQ(0, this->mFacade.setRecordOutput(1));
    EXPECT_EQ(0, this->mFacade.startRecord());
    ring.put();
    EXPECT_TRUE(frames.waitFor(1));
    EXPECT_EQ(0, this->mFacade.stopRecord());
    EXPECT_EQ(0, frames[0].zero);
    EXPECT_EQ(ring.slot(0), frames[0].data);
}

TYPED_TEST(CompanionFacade, ConnectsAndSaysNothing) {
    EXPECT_EQ(0, this->mFacade.init());
    EXPECT_THAT(this->mService->calls(), ElementsAre("registerClient", "open"));
    EXPECT_THAT(linesOf(kFacadeTag), IsEmpty());
}

TYPED_TEST(CompanionFacade, ASecondInitReplacesTheClient) {
    this->connectFacade();
    EXPECT_EQ(0, this->mFacade.init());
    EXPECT_THAT(this->mService->calls(), ElementsAre("unregisterClient", "registerClient", "open"));
}

TYPED_TEST(CompanionFacade, ReleasesItsClientWithItself) {
    this->connectFacade();
    this->mFacade.destroy();
    EXPECT_THAT(this->mService->calls(), ElementsAre("unregisterClient"));
}

TYPED_TEST(CompanionFacade, IsDestroyedThroughItsTableBeforeItHasAClient) {
    this->mFacade.destroy();
    EXPECT_THAT(this->mService->calls(), IsEmpty());
}

TYPED_TEST(CompanionFacade, KeepsAClientThatFoundNoService) {
    this->mServices->remove("pemaro.TouchService");
    EXPECT_EQ(0x4000000A, this->mFacade.init());
    clearLog();
    EXPECT_EQ(0x4000000B, this->mFacade.setRecordOutput(0));
    EXPECT_EQ(0x4000000B, this->mFacade.startRecord());
    EXPECT_EQ(0x4000000B, this->mFacade.stopRecord());
    EXPECT_EQ(0x4000000B, this->mFacade.setConfigParams("", 0ul));
    EXPECT_EQ(0x4000000B, this->mFacade.getPacketSize());
    unsigned int inspected = 0;
    EXPECT_EQ(0x4000000B, this->mFacade.inspect(&inspected));
    unsigned long length = 0;
    EXPECT_EQ(0x4000000B, this->mFacade.getConfigParams(nullptr, &length));
    const auto params = make<ISerializableParams4>(4);
    EXPECT_EQ(0, this->mFacade.getConfigParams(params.get()));
    store(*params, "gain", "");
    EXPECT_EQ(0x4000000B, this->mFacade.getConfigParams(params.get()));
    this->mFacade.destroy();
    EXPECT_THAT(this->mService->calls(), IsEmpty());
}

TYPED_TEST(CompanionFacade, OnlyTheCurrentOneLogsThatItFoundNoService) {
    this->mServices->remove("pemaro.TouchService");
    EXPECT_EQ(0x4000000A, this->mFacade.init());
    const Lines expected = TestFixture::mFacade.kIsCurrent
                                   ? Lines{"E Fails to initialize TouchCompanionClient"}
                                   : Lines{};
    EXPECT_EQ(expected, linesOf(kFacadeTag));
}

TYPED_TEST(CompanionFacade, OnlyTheCurrentOneLogsThatTheServiceRefused) {
    this->mService->setStatus("open", STATUS_INVALID_STATE);
    EXPECT_EQ(STATUS_INVALID_STATE, this->mFacade.init());
    EXPECT_EQ(TestFixture::mFacade.kIsCurrent ? 1u : 0u, linesOf(kFacadeTag).size());
}

// ---- configuration parameters ----

TYPED_TEST(CompanionFacade, FillsAParameterObject) {
    this->connectFacade();
    this->mService->params = mapOf(R"({"gain":3})");
    const auto params = make<ISerializableParams4>(4);
    ASSERT_EQ(0, store(*params, "gain", ""));
    EXPECT_EQ(0, this->mFacade.getConfigParams(params.get()));
    EXPECT_EQ(R"(getConfigParams({"gain":""}))", this->onlyCall());
    std::string value;
    EXPECT_EQ(0, params->getValue("gain", value));
    EXPECT_EQ("3", value);
}

TYPED_TEST(CompanionFacade, FillsAnOlderParameterObjectAsWell) {
    this->connectFacade();
    this->mService->params = mapOf(R"({"gain":3,"name":"pen"})");
    const auto params = make<ISerializableParams3>(3);
    ASSERT_EQ(0, store(*params, "gain", ""));
    EXPECT_EQ(0,
              this->mFacade.getConfigParams(reinterpret_cast<ISerializableParams4*>(params.get())));
    ASSERT_EQ(2, params->size());
    std::string key;
    std::string value;
    EXPECT_EQ(0, params->getKey(1, key));
    EXPECT_EQ("name", key);
    EXPECT_EQ(0, params->getValue(1, value));
    EXPECT_EQ("pen", value);
}

// The map is read where it lies: a parameter object without a table is as good.
TYPED_TEST(CompanionFacade, CallsNothingOfAParameterObject) {
    this->connectFacade();
    this->mService->params = mapOf(R"({"gain":3})");
    const auto params = make<ISerializableParams4>(4);
    ASSERT_EQ(0, store(*params, "gain", ""));
    void* table;
    void* const none = nullptr;
    void* const object = params.get();
    memcpy(&table, object, sizeof(table));
    memcpy(object, &none, sizeof(none));
    EXPECT_EQ(0, this->mFacade.getConfigParams(params.get()));
    memcpy(object, &table, sizeof(table));
    std::string value;
    EXPECT_EQ(0, params->getValue("gain", value));
    EXPECT_EQ("3", value);
}

TYPED_TEST(CompanionFacade, AsksNothingForAParameterObjectWithoutEntries) {
    this->connectFacade();
    const auto params = make<ISerializableParams4>(4);
    EXPECT_EQ(0, this->mFacade.getConfigParams(params.get()));
    this->expectNothingSent();
}

TYPED_TEST(CompanionFacade, PassesTheStatusOfAParameterReadOn) {
    this->connectFacade();
    this->mService->setStatus("getConfigParams", STATUS_NOT_FOUND);
    const auto params = make<ISerializableParams4>(4);
    store(*params, "gain", "");
    EXPECT_EQ(STATUS_NOT_FOUND, this->mFacade.getConfigParams(params.get()));
}

TYPED_TEST(CompanionFacade, RefusesNoParameterObject) {
    // Needs no client.
    EXPECT_EQ(0x4000000D, this->mFacade.getConfigParams(nullptr));
    EXPECT_THAT(linesOf(kFacadeTag), ElementsAre("E error: params is null"));
    this->expectNothingSent();
}

TYPED_TEST(CompanionFacade, SetsNoParameterObject) {
    EXPECT_EQ(0x4000000E, this->mFacade.setConfigParams(nullptr));
    this->connectFacade();
    const auto params = make<ISerializableParams4>(4);
    store(*params, "gain", "3");
    EXPECT_EQ(0x4000000E, this->mFacade.setConfigParams(params.get()));
    EXPECT_EQ(0x4000000E, this->mFacade.setConfigParams(nullptr));
    this->expectNothingSent();
    EXPECT_THAT(linesOf(kFacadeTag), IsEmpty());
}

// ---- the current facade's own ----

class CurrentFacade : public CompanionFacade<Facade> {};

TEST_F(CurrentFacade, SetsTheRecordFilter) {
    connectFacade();
    mService->response = mapOf(R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":0}}})");
    EXPECT_EQ(0, mFacade.setRecordFilter(0x1F));
    EXPECT_EQ(R"(sendCommand({"DEBUG_COMMAND":{"REQUEST":{"ACTION":"SET_RECORD_FILTER",)"
              R"("PARAMETERS":{"MASK":31}}}}))",
              onlyCall());
}

TEST_F(CurrentFacade, SendsACommandWhoseAnswerIsTheCallers) {
    connectFacade();
    mService->response = mapOf(R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":)"
                               R"({"OUT_STRING":"done","OUT_VALUE":4}}}})");
    char* result = nullptr;
    EXPECT_EQ(0, mFacade.sendCommand("status", &result));
    EXPECT_EQ(R"(sendCommand({"DEBUG_COMMAND":{"REQUEST":{"ACTION":"SEND_COMMAND",)"
              R"("PARAMETERS":{"NUM_OF_ELEMENTS":0,"SEND_COMMAND_NAME":"status"}}}}))",
              onlyCall());
    EXPECT_STREQ("done", result);
    free(result);
}

TEST_F(CurrentFacade, RefusesNoCommandInSilence) {
    char untouched[] = "";
    char* result = untouched;
    // Needs no client.
    EXPECT_EQ(0x4000000D, mFacade.sendCommand(nullptr, &result));
    connectFacade();
    EXPECT_EQ(0x4000000D, mFacade.sendCommand(nullptr, &result));
    EXPECT_EQ(untouched, result);
    expectNothingSent();
    EXPECT_THAT(clientLines(), IsEmpty());
    EXPECT_THAT(linesOf(kFacadeTag), IsEmpty());
}

// ---- the older facade's own ----

class OlderFacade : public CompanionFacade<FacadeOld> {};

TEST_F(OlderFacade, DescribesNoFormat) {
    std::string first = "one";
    std::string second = "two";
    EXPECT_EQ(0x4000000E, mFacade.getFormatDescription(first, second));
    connectFacade();
    EXPECT_EQ(0x4000000E, mFacade.getFormatDescription(first, second));
    EXPECT_EQ("one", first);
    EXPECT_EQ("two", second);
    expectNothingSent();
}

// ---- the interfaces as they are declared ----

// The positions that both have.
template <typename Interface>
void expectCommonOrder() {
    using OfParams = int (Interface::*)(ISerializableParams4*);
    using GetBinary = int (Interface::*)(void*, unsigned long*);
    using SetBinary = int (Interface::*)(const void*, unsigned long);
    EXPECT_EQ(2, slotOf(&Interface::getClassID));
    EXPECT_EQ(3, slotOf(&Interface::init));
    EXPECT_EQ(4, slotOf(&Interface::setRecordOutput));
    EXPECT_EQ(5, slotOf(&Interface::startRecord));
    EXPECT_EQ(6, slotOf(&Interface::stopRecord));
    EXPECT_EQ(7, slotOf<OfParams>(&Interface::getConfigParams));
    EXPECT_EQ(8, slotOf<OfParams>(&Interface::setConfigParams));
    EXPECT_EQ(9, slotOf<GetBinary>(&Interface::getConfigParams));
    EXPECT_EQ(10, slotOf<SetBinary>(&Interface::setConfigParams));
}

TEST(CompanionFacadeInterfaces, DeclareTheirOperationsInTheOrderOfTheTable) {
    expectCommonOrder<Facade>();
    EXPECT_EQ(11, slotOf(&Facade::getPacketSize));
    EXPECT_EQ(12, slotOf(&Facade::inspect));
    EXPECT_EQ(13, slotOf(&Facade::setRecordFilter));
    EXPECT_EQ(14, slotOf(&Facade::sendCommand));

    expectCommonOrder<FacadeOld>();
    EXPECT_EQ(11, slotOf(&FacadeOld::getFormatDescription));
    EXPECT_EQ(12, slotOf(&FacadeOld::getPacketSize));
    EXPECT_EQ(13, slotOf(&FacadeOld::inspect));
}

}  // namespace
}  // namespace pemaro::test
