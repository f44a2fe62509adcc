// SPDX-License-Identifier: Apache-2.0
// Services that answer what they should not.

#include <binder/IServiceManager.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <string>
#include <vector>

#include "pemaro/BpTouchCompanionService.h"
#include "pemaro/Status.h"
#include "tests/driver/DriverSetting.h"
#include "tests/driver/FrameCollector.h"

using android::sp;
using android::String16;
using testing::MatchesRegex;

namespace pemaro::test {

namespace {

class GarbageService {
  public:
    explicit GarbageService(const std::vector<std::string>& mode) : mProcess(command(mode)) {
        EXPECT_TRUE(mProcess.awaitOutput("process ")) << mProcess.errors();
    }

    static sp<ITouchCompanionService> proxy() {
        return ITouchCompanionService::asInterface(
                android::defaultServiceManager()->checkService(String16("pemaro.TouchService")));
    }

    /// Ends it without warning.
    void kill() {
        mProcess.signal(SIGKILL);
        EXPECT_EQ(128 + SIGKILL, mProcess.wait());
    }

  private:
    static std::vector<std::string> command(const std::vector<std::string>& mode) {
        std::vector<std::string> command = {binary("garbage-service")};
        command.insert(command.end(), mode.begin(), mode.end());
        return command;
    }

    ChildProcess mProcess;
};

}  // namespace

TEST(EmptyReplies, AreReadAsZeros) {
    GarbageService garbage({"reply"});
    sp<ITouchCompanionService> service = GarbageService::proxy();
    ASSERT_NE(nullptr, service);
    SerializableMap map;
    SerializableMapArray array;
    map.add("wanted", 1);
    unsigned int value = 7;
    int session = 7;
    EXPECT_EQ(0, service->open());
    EXPECT_EQ(0, service->startRecord());
    EXPECT_EQ(0, service->getPacketSize());
    EXPECT_EQ(0, service->inspect(&value));
    EXPECT_EQ(0u, value);
    EXPECT_EQ(0, service->saveSession(session));
    EXPECT_EQ(0, session);
    EXPECT_EQ(nullptr, service->getCblk());
    EXPECT_EQ(STATUS_INVALID_FORMAT, service->getProperties(map));
    EXPECT_EQ(STATUS_INVALID_FORMAT, service->getConfigParams(map));
    EXPECT_EQ(STATUS_INVALID_FORMAT, service->getAFEParams(array));
    char buffer[16];
    EXPECT_EQ(0u, service->getConfigParams(buffer, sizeof(buffer)));
    EXPECT_EQ(0u, service->getConfigParams(nullptr, 0));
}

TEST(NegativeLengths, AreNotFollowed) {
    // Success, and a length of -1.
    GarbageService garbage({"reply", "0", "-1"});
    sp<ITouchCompanionService> service = GarbageService::proxy();
    ASSERT_NE(nullptr, service);
    SerializableMap map;
    map.add("kept", 1);
    SerializableMapArray array;
    EXPECT_EQ(STATUS_INVALID_FORMAT, service->getProperties(map));
    EXPECT_EQ(STATUS_INVALID_FORMAT, service->getAFEParams(map));
    EXPECT_EQ(STATUS_INVALID_FORMAT, service->getConfigParams(map));
    EXPECT_EQ(STATUS_INVALID_FORMAT, service->getAFEParams(array));
    EXPECT_EQ("{\"kept\":1}", map.serialize());
}

TEST(NegativeLengths, OfTheBinaryConfigurationExceedEveryBuffer) {
    GarbageService garbage({"reply", "-1"});
    sp<TouchCompanionClient> client = new TouchCompanionClient();
    EXPECT_EQ(-1, client->init());
    sp<ITouchCompanionService> service = GarbageService::proxy();
    ASSERT_NE(nullptr, service);
    char buffer[16] = "untouched";
    EXPECT_GT(service->getConfigParams(buffer, sizeof(buffer)), sizeof(buffer));
    EXPECT_STREQ("untouched", buffer);
}

TEST(ShortReplies, AreNotReadBeyondTheirEnd) {
    // A string that announces 4096 characters and a binary block of 16 bytes, neither of them there.
    GarbageService garbage({"reply", "0", "4096"});
    sp<ITouchCompanionService> service = GarbageService::proxy();
    ASSERT_NE(nullptr, service);
    SerializableMap map;
    EXPECT_EQ(STATUS_INVALID_FORMAT, service->getProperties(map));

    GarbageService next({"reply", "16"});
    service = GarbageService::proxy();
    ASSERT_NE(nullptr, service);
    char buffer[16];
    EXPECT_EQ(0u, service->getConfigParams(buffer, sizeof(buffer)));
}

TEST(GarbageReplies, ArriveAsTheStatusThatTheyAre) {
    GarbageService garbage({"reply", "0x5A5A5A5A", "0x5A5A5A5A", "0x5A5A5A5A", "0x5A5A5A5A"});
    sp<TouchCompanionClient> client = new TouchCompanionClient();
    EXPECT_EQ(0x5A5A5A5A, client->init());
    SerializableMap map;
    sp<ITouchCompanionService> service = GarbageService::proxy();
    ASSERT_NE(nullptr, service);
    EXPECT_EQ(nullptr, service->getCblk());
    EXPECT_EQ(0x5A5A5A5A, service->getProperties(map));
}

TEST(Blocks, ThatCannotBeWorkedInAreRefused) {
    for (const char* mode : {"no-block", "short-block", "read-only-block", "misaligned-block"}) {
        GarbageService garbage({mode});
        FrameCollector frames;
        sp<TouchCompanionClient> client = frames.connect();
        ASSERT_NE(nullptr, client);
        EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord()) << mode;
        EXPECT_EQ(0u, frames.frames());
    }
}

// ---- services that die in the ring ----

class RuinedBlocks : public ::testing::TestWithParam<const char*> {};

// Far less than for ever, and enough for a machine in a machine.
constexpr std::chrono::seconds kSoon{10};

TEST_P(RuinedBlocks, HoldNoClientUp) {
    GarbageService garbage({"ruined-block", GetParam()});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    ASSERT_EQ(0, client->startRecord());
    usleep(200000);
    garbage.kill();
    const auto before = std::chrono::steady_clock::now();
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->stopRecord());
    client.clear();
    EXPECT_LT(std::chrono::steady_clock::now() - before, kSoon);
    EXPECT_EQ(0u, frames.frames());
}

TEST_P(RuinedBlocks, LetARecordingBeInterrupted) {
    GarbageService garbage({"ruined-block", GetParam()});
    ChildProcess record({binary("zelkctl"), "record"});
    usleep(500000);
    EXPECT_TRUE(record.isRunning());
    garbage.kill();
    record.signal(SIGINT);
    EXPECT_NE(ChildProcess::kTimedOut, record.wait(kSoon)) << record.errors();
}

INSTANTIATE_TEST_SUITE_P(All, RuinedBlocks,
                         ::testing::Values("held-mutex", "dead-signal", "clock", "mutex"),
                         [](const auto& info) {
                             std::string name = info.param;
                             name.erase(std::remove(name.begin(), name.end(), '-'), name.end());
                             return name;
                         });

namespace {

struct Block {
    const char* frames;
    const char* bytes;
    const char* length;
    const char* errors;
};

class GarbageBlocks : public ::testing::TestWithParam<Block> {};

constexpr char kNoLength[] =
        "zelkctl: [0-9]+ corrupt frames; frame 0 tells a length of 0 bytes, with packets of 4096\n";

}  // namespace

TEST_P(GarbageBlocks, AreRecordedWithoutAReadOutside) {
    const Block& block = GetParam();
    GarbageService garbage({"block", block.frames, block.bytes, block.length});
    const RunResult record = run({binary("zelkctl"), "record", "--seconds", "0.5"});
    EXPECT_EQ(1, record.status);
    EXPECT_THAT(record.errors, MatchesRegex(block.errors));
}

INSTANTIATE_TEST_SUITE_P(
        All, GarbageBlocks,
        ::testing::Values(
                Block{"0", "4096", "0", kNoLength},  //
                Block{"8", "0", "0", kNoLength},     //
                Block{"0", "0", "0", kNoLength},     //
                Block{"8", "0xFFFFFFFF", "0", kNoLength},
                Block{"0xFFFFFFFF", "4096", "0", kNoLength},
                Block{"8", "4096", "4097",
                      "zelkctl: [0-9]+ corrupt frames; frame 0 tells a length of 4097 bytes, "
                      "with packets of 4096\n"},
                Block{"8", "4096", "0xFFFFFFFF",
                      "zelkctl: [0-9]+ corrupt frames; frame 0 tells a length of 4294967295 bytes, "
                      "with packets of 4096\n"}));

}  // namespace pemaro::test
