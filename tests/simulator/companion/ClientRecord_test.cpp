// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/ClientRecord.h"

#include "pemaro/Binder.h"

#include <gtest/gtest.h>

#include <memory>

#include "pemaro/Status.h"

using android::BBinder;
using android::IBinder;
using android::sp;

namespace pemaro::simulator {

namespace {

class ClientRecordTest : public ::testing::Test {
  protected:
    int stop() {
        Recording::Counts counts;
        return client.stop(&counts);
    }

    SimulatorOptions options;
    ClientRecord client{1, options,
                        std::make_shared<std::atomic<uint32_t>>(frames::kFilterDefault)};
};

}  // namespace

TEST_F(ClientRecordTest, RefusesWhatIsOutOfTurn) {
    EXPECT_EQ(STATUS_INVALID_STATE, client.prepare());
    client.open();
    EXPECT_EQ(STATUS_INVALID_STATE, client.prepare());
    EXPECT_EQ(STATUS_INVALID_STATE, client.start());
    EXPECT_EQ(STATUS_INVALID_STATE, stop());
    EXPECT_EQ(nullptr, client.block());

    ASSERT_EQ(0, client.setOutput(1));
    EXPECT_EQ(STATUS_INVALID_STATE, client.start());
    ASSERT_EQ(0, client.prepare());
    EXPECT_EQ(STATUS_INVALID_STATE, stop());
    EXPECT_NE(nullptr, client.block());
    ASSERT_EQ(0, client.start());

    EXPECT_TRUE(client.isRecording());
    EXPECT_EQ(nullptr, client.block());
    EXPECT_EQ(STATUS_INVALID_STATE, client.prepare());
    EXPECT_EQ(STATUS_INVALID_STATE, client.start());
    EXPECT_EQ(STATUS_INVALID_STATE, client.setOutput(0));
    ASSERT_EQ(0, stop());

    EXPECT_FALSE(client.isRecording());
    EXPECT_EQ(STATUS_INVALID_STATE, stop());
    EXPECT_EQ(STATUS_INVALID_STATE, client.start());
    EXPECT_EQ(0, client.prepare());
}

TEST_F(ClientRecordTest, MakesANewBlockForEachPreparation) {
    client.open();
    ASSERT_EQ(0, client.setOutput(1));
    ASSERT_EQ(0, client.prepare());
    const sp<android::IMemory> first = client.block();
    ASSERT_EQ(0, client.prepare());
    EXPECT_NE(first, client.block());
}

TEST_F(ClientRecordTest, KnowsTwoOutputs) {
    EXPECT_EQ(0, client.setOutput(0));
    EXPECT_EQ(0, client.setOutput(1));
    EXPECT_EQ(STATUS_BAD_PARAMETER, client.setOutput(2));
    EXPECT_EQ(STATUS_BAD_PARAMETER, client.setOutput(-1));
}

TEST_F(ClientRecordTest, NeedsAFileForTheFileOutput) {
    client.open();
    ASSERT_EQ(0, client.setOutput(0));
    ASSERT_EQ(0, client.prepare());
    EXPECT_EQ(nullptr, client.block());
    EXPECT_EQ(STATUS_INVALID_FILE_PATH, client.start());
    EXPECT_EQ(STATUS_INVALID_FILE_PATH, client.setFile(""));
    ASSERT_EQ(0, client.setFile("/no/such/folder/file"));
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, client.start());
    ASSERT_EQ(0, client.setFile("/dev/null"));
    EXPECT_EQ(0, client.start());
}

TEST_F(ClientRecordTest, TellsAHugeRingThatCannotBeMade) {
    options.frameBytes = 0xFFFFFFFF;
    options.ringFrames = 0xFFFFFFFF;
    client.open();
    ASSERT_EQ(0, client.setOutput(1));
    EXPECT_EQ(STATUS_ERROR_ALLOCATING_MEMORY, client.prepare());
    EXPECT_EQ(STATUS_INVALID_STATE, client.start());
}

TEST_F(ClientRecordTest, KeepsTheHandlesOfItsProcess) {
    const sp<IBinder> first = new BBinder();
    const sp<IBinder> second = new BBinder();
    EXPECT_FALSE(client.hasHandles());
    client.addHandle(first);
    client.addHandle(second);
    EXPECT_FALSE(client.removeHandle(nullptr));
    EXPECT_TRUE(client.removeHandle(first.get()));
    EXPECT_FALSE(client.removeHandle(first.get()));
    EXPECT_EQ(second, client.takeHandle());
    EXPECT_FALSE(client.hasHandles());
}

}  // namespace pemaro::simulator
