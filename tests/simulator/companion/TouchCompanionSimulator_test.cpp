// SPDX-License-Identifier: Apache-2.0
// The simulated service with the real client, in one process.

#include "simulator/companion/TouchCompanionSimulator.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <condition_variable>
#include <cstdlib>
#include <mutex>
#include <string>
#include <vector>

#include "pemaro/BpTouchCompanionService.h"
#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/testkit/FakeServiceManager.h"

using android::sp;

namespace pemaro::simulator {

namespace {

class TouchCompanionSimulatorTest : public ::testing::Test {
  protected:
    TouchCompanionSimulatorTest() {
        options.rate = 0;
        options.frameBytes = 500;
        options.ringFrames = 4;
        options.narrate = [this](const std::string& line) { story.push_back(line); };
    }

    // Serves with `options`, and connects a client.
    sp<TouchCompanionClient> connect() {
        service = new TouchCompanionSimulator(options);
        services->add("pemaro.TouchService", service);
        sp<TouchCompanionClient> client = new TouchCompanionClient(onFrame, this);
        EXPECT_EQ(0, client->init());
        return client;
    }

    static void onFrame(int, void* frame, unsigned long bytes, void* context) {
        auto* test = static_cast<TouchCompanionSimulatorTest*>(context);
        std::lock_guard<std::mutex> guard(test->lock);
        frames::FrameHeader header{};
        EXPECT_STREQ(nullptr, frames::frameFault(frame, bytes));
        frames::readFrameHeader(frame, bytes, &header);
        EXPECT_EQ(test->frames, header.sequence);
        test->frames += 1;
        test->changed.notify_all();
    }

    void awaitFrames(uint32_t count) {
        std::unique_lock<std::mutex> guard(lock);
        changed.wait(guard, [this, count] { return frames >= count; });
    }

    void order(const std::string& text) {
        std::string problem;
        const auto fault = Fault::parse(text, &problem);
        ASSERT_TRUE(fault) << problem;
        service->faults().add(*fault);
    }

    const std::string name = "client " + std::to_string(getpid());
    test::ScopedServiceManager services;
    SimulatorOptions options;
    std::vector<std::string> story;
    sp<TouchCompanionSimulator> service;

    std::mutex lock;
    std::condition_variable changed;
    uint32_t frames = 0;
};

}  // namespace

TEST_F(TouchCompanionSimulatorTest, RecordsToItsClient) {
    sp<TouchCompanionClient> client = connect();
    ASSERT_EQ(0, client->setRecordOutput(1));
    ASSERT_EQ(0, client->startRecord());
    awaitFrames(50);
    unsigned int word = 0;
    EXPECT_EQ(0, service->inspect(&word));
    EXPECT_EQ(0x01010000u, word);
    EXPECT_EQ(0, client->stopRecord());
    const TouchCompanionSimulator::Totals totals = service->totals();
    EXPECT_EQ(1u, totals.clients);
    EXPECT_EQ(1u, totals.recordings);
    EXPECT_GE(totals.produced, 50u);
    EXPECT_EQ(0u, totals.dropped);
    client.clear();
    EXPECT_EQ((std::vector<std::string>{name + " registered", name + " records",
                                        name + " stopped: " + std::to_string(totals.produced) +
                                                " frames, 0 without room in the ring",
                                        name + " unregistered"}),
              story);
    EXPECT_EQ(0u, service->totals().clients);
}

TEST_F(TouchCompanionSimulatorTest, WantsToKnowItsClientsFirst) {
    service = new TouchCompanionSimulator(options);
    EXPECT_EQ(STATUS_INVALID_STATE, service->open());
    EXPECT_EQ(STATUS_INVALID_STATE, service->setRecordParameter(1));
    EXPECT_EQ(STATUS_INVALID_STATE, service->setRecordFile("/dev/null"));
    EXPECT_EQ(STATUS_INVALID_STATE, service->prepareRecord());
    EXPECT_EQ(nullptr, service->getCblk());
    EXPECT_EQ(STATUS_INVALID_STATE, service->startRecord());
    EXPECT_EQ(STATUS_INVALID_STATE, service->stopRecord());
    EXPECT_EQ(STATUS_INVALID_STATE, service->close());
    EXPECT_EQ(STATUS_INVALID_STATE, service->unregisterClient());
    EXPECT_EQ(STATUS_BAD_PARAMETER, service->registerClient(nullptr));
}

TEST_F(TouchCompanionSimulatorTest, EndsTheRecordingOfWhoeverLeaves) {
    sp<TouchCompanionClient> client = connect();
    ASSERT_EQ(0, client->setRecordOutput(1));
    ASSERT_EQ(0, client->startRecord());
    awaitFrames(1);
    EXPECT_EQ(0, service->close());
    EXPECT_EQ(1u, service->totals().recordings);
    EXPECT_EQ(STATUS_INVALID_STATE, client->stopRecord());

    ASSERT_EQ(0, service->open());
    frames = 0;
    ASSERT_EQ(0, client->startRecord());
    awaitFrames(1);
    service->shutDown();
    EXPECT_EQ(2u, service->totals().recordings);
    EXPECT_EQ(0u, service->totals().clients);
}

TEST_F(TouchCompanionSimulatorTest, StrikesWithTheFaultsOrdered) {
    sp<TouchCompanionClient> client = connect();
    ASSERT_EQ(0, client->setRecordOutput(1));
    order("getCblk=null");
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord());
    service->faults().clear();
    order("startRecord=status:0x40000010");
    EXPECT_EQ(STATUS_ERROR_AFE_HAL, client->startRecord());
    order("getConfigParams=status:5");
    EXPECT_EQ(0u, service->getConfigParams(nullptr, 0));
    service->faults().clear();
    EXPECT_EQ(0, client->startRecord());
    EXPECT_EQ(0, client->stopRecord());
}

TEST_F(TouchCompanionSimulatorTest, HandsItsConfigurationOut) {
    sp<TouchCompanionClient> client = connect();
    EXPECT_EQ(500, client->getPacketSize());
    size_t length = 0;
    ASSERT_EQ(0, client->getConfigParams(nullptr, &length));
    std::vector<char> buffer(length);
    ASSERT_EQ(0, client->getConfigParams(buffer.data(), &length));
    EXPECT_EQ(buffer.size(), length);
    EXPECT_EQ(0, client->setConfigParams(buffer.data(), length));
    buffer[100] ^= 1;
    EXPECT_EQ(STATUS_CORRUPT_DATA, client->setConfigParams(buffer.data(), length));
    length -= 1;
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->getConfigParams(buffer.data(), &length));

    SerializableMap params;
    params.add("gain", 0);
    EXPECT_EQ(0, client->getConfigParams(params));
    EXPECT_EQ("{\"gain\":1.500000}", params.serialize());
}

TEST_F(TouchCompanionSimulatorTest, SavesItsConfigurationToItsOwnPlaceOrAnother) {
    sp<TouchCompanionClient> client = connect();
    EXPECT_EQ(STATUS_INVALID_FILE_PATH, client->saveConfig(nullptr));
    EXPECT_EQ(STATUS_INVALID_FILE_PATH, client->reloadConfig(nullptr));
    const std::string empty;
    EXPECT_EQ(STATUS_INVALID_FILE_PATH, client->saveConfig(&empty));
    client.clear();

    options.configPath = testing::TempDir() + "TouchCompanionSimulator_test.conf";
    const std::string other = options.configPath + ".other";
    client = connect();
    EXPECT_EQ(0, client->saveConfig(nullptr));
    EXPECT_EQ(0, client->saveConfig(&other));
    EXPECT_EQ(0, client->reloadConfig(nullptr));
    EXPECT_EQ(0, client->reloadConfig(&other));
    EXPECT_EQ(0, unlink(options.configPath.c_str()));
    EXPECT_EQ(0, unlink(other.c_str()));
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, client->reloadConfig(nullptr));
}

TEST_F(TouchCompanionSimulatorTest, CountsEvents) {
    sp<TouchCompanionClient> client = connect();
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(0, client->sendEvent(static_cast<eventType>(7), static_cast<eventParam>(i)));
    }
    unsigned int word = 0;
    EXPECT_EQ(0, client->inspect(&word));
    EXPECT_EQ(0x00010003u, word);
    EXPECT_EQ("event 7 with 2", story.back());
}

TEST_F(TouchCompanionSimulatorTest, AnswersCommandsAndSessions) {
    sp<TouchCompanionClient> client = connect();
    char* text = nullptr;
    EXPECT_EQ(0, client->sendCommand("calibrate 3 0x10", &text));
    EXPECT_STREQ("done", text);
    free(text);
    EXPECT_EQ(STATUS_ERROR_AFE_HAL, client->sendCommand("fail", &text));
    EXPECT_EQ(STATUS_INVALID_STATE, client->sendCommand("factoryreset", &text));
    EXPECT_EQ(STATUS_BAD_PARAMETER, client->setAuth("guess"));
    EXPECT_EQ(0, client->setAuth("zelk"));
    EXPECT_EQ(0, client->sendCommand("factoryreset", &text));
    EXPECT_STREQ("response success", text);
    free(text);
    EXPECT_EQ(0, client->setRecordFilter(1));
    int session = 0;
    EXPECT_EQ(0, client->saveSession(session));
    EXPECT_EQ(0, client->setRecordFilter(2));
    EXPECT_EQ(0, client->restoreSession(session));
    EXPECT_EQ(STATUS_NOT_FOUND, client->restoreSession(session + 1));
    EXPECT_EQ(0, client->sendCommand("status", &text));
    EXPECT_STREQ("filter=1 events=0 authenticated=yes", text);
    free(text);
    EXPECT_EQ(0, client->setProperty("setRollingLogSize", "512"));
    EXPECT_EQ(STATUS_BAD_PARAMETER, client->setProperty("setRollingLogSize", "-1"));
    SerializableMap properties;
    EXPECT_EQ(0, service->getProperties(properties));
    EXPECT_EQ("512", properties.editValueFor("rollingLogSize").serialize());
}

TEST_F(TouchCompanionSimulatorTest, HasAnAnalogFrontEnd) {
    service = new TouchCompanionSimulator(options);
    SerializableMap params;
    SerializableMapArray channels;
    params.add("frequency", 300000);
    EXPECT_EQ(0, service->setAFEParams(params));
    EXPECT_EQ(0, service->getAFEParams(params));
    EXPECT_EQ("300000", params.editValueFor("frequency").serialize());
    EXPECT_EQ(0, service->getAFEParams(channels));
    EXPECT_EQ(0u, channels.serialize().find("[{\"channel\":0,"));
}

// The text form of a map has its gaps: what a client is to read has to survive it.
TEST_F(TouchCompanionSimulatorTest, AnswersWithTextsThatAProxyCanRead) {
    service = new TouchCompanionSimulator(options);
    const sp<ITouchCompanionService> proxy =
            new BpTouchCompanionService(android::IInterface::asBinder(service));
    SerializableMap properties;
    EXPECT_EQ(0, proxy->getProperties(properties));
    EXPECT_EQ(
            "{\"authenticated\":false,\"events\":0,\"recordFilter\":3,\"rollingLogSize\":256,"
            "\"sessions\":0}",
            properties.serialize());
    SerializableMap params;
    EXPECT_EQ(0, proxy->getAFEParams(params));
    EXPECT_EQ("{\"drive.voltage\":3.300000,\"frequency\":250000,\"integration.cycles\":16}",
              params.serialize());
    EXPECT_EQ(0, proxy->setAFEParams(params));
    SerializableMapArray channels;
    EXPECT_EQ(0, proxy->getAFEParams(channels));
    SerializableMap last;
    EXPECT_EQ(0, channels.get(3).getValue(last));
    EXPECT_EQ(4u, last.size());
    EXPECT_EQ("3", last.editValueFor("channel").serialize());
    SerializableMap wanted;
    for (const char* key : {"device.name", "edge.zones", "gain", "palm.rejection", "panel.size"}) {
        wanted.add(key, std::string("?"));
    }
    EXPECT_EQ(0, proxy->getConfigParams(wanted));
    EXPECT_EQ(
            "{\"device.name\":\"simulated touch panel\",\"edge.zones\":[0,120,240],"
            "\"gain\":1.500000,\"palm.rejection\":true,"
            "\"panel.size\":{\"height\":2340,\"width\":1080}}",
            wanted.serialize());
    for (const char* text :
         {"{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SET_RECORD_FILTER\","
          "\"PARAMETERS\":{\"MASK\":1}}}}",
          "{\"PROPERTY_COMMAND\":{\"REQUEST\":{\"ACTION\":\"STR_SET_ROLLINGLOG_SIZE\","
          "\"PARAMETERS\":{\"NUM_OF_ELEMENTS\":1,\"SEND_COMMAND_NAME\":\"setRollingLogSize\","
          "\"VALUES\":[8]}}}}"}) {
        SerializableMap request;
        SerializableMap response;
        EXPECT_EQ(0, request.unserialize(text));
        EXPECT_EQ(0, proxy->sendCommand(request, response)) << text;
        EXPECT_EQ(1u, response.size()) << text;
    }
}

}  // namespace pemaro::simulator
