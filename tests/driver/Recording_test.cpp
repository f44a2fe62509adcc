// SPDX-License-Identifier: Apache-2.0
// Frames from the simulated touch stack to clients, in processes of their own.

#include <gtest/gtest.h>
#include <signal.h>
#include <stdlib.h>
#include <unistd.h>

#include <chrono>
#include <fstream>
#include <iterator>
#include <ostream>
#include <string>
#include <thread>

#include "frames/Frame.h"
#include "pemaro/Status.h"
#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tests/driver/FrameCollector.h"

using android::sp;

namespace pemaro::test {

namespace {

struct Geometry {
    uint32_t frameBytes;
    uint32_t ringFrames;
    uint64_t frames;
};

std::ostream& operator<<(std::ostream& stream, const Geometry& geometry) {
    return stream << geometry.frameBytes << " bytes, ring of " << geometry.ringFrames;
}

class RecordingGeometry : public ::testing::TestWithParam<Geometry> {};

}  // namespace

TEST_P(RecordingGeometry, DeliversEveryFrameWhole) {
    const Geometry& geometry = GetParam();
    TouchStack touchStack({"--rate", "0", "--frame-bytes", std::to_string(geometry.frameBytes),
                           "--ring-frames", std::to_string(geometry.ringFrames)});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    ASSERT_EQ(0, client->startRecord());
    EXPECT_TRUE(frames.await(geometry.frames)) << frames.frames();
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_EQ("", frames.firstFault());
    EXPECT_EQ(0u, frames.lost());
}

// A ring of one frame is filled and emptied in turn, with a wait of 16 ms between.
INSTANTIATE_TEST_SUITE_P(Sizes, RecordingGeometry,
                         ::testing::Values(Geometry{40, 64, 1000},      // a header alone
                                           Geometry{64, 1, 20},         //
                                           Geometry{4096, 64, 1000},    //
                                           Geometry{4097, 3, 100},      // nothing is aligned
                                           Geometry{1000, 1000, 2500},  //
                                           Geometry{65536, 8, 100},     //
                                           Geometry{1048576, 4, 12}));

TEST(Recording, KeepsUpWithThePaceOfATouchPanel) {
    TouchStack touchStack({"--rate", "240", "--ring-frames", "1024"});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    ASSERT_EQ(0, client->startRecord());
    EXPECT_TRUE(frames.await(480));
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_EQ("", frames.firstFault());
    EXPECT_EQ(0u, frames.lost());
}

TEST(Recording, ShowsWhatASlowReaderMissedAsAGap) {
    TouchStack touchStack({"--rate", "500", "--ring-frames", "4"});
    FrameCollector frames;
    frames.setPause(std::chrono::milliseconds(40));
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    ASSERT_EQ(0, client->startRecord());
    EXPECT_TRUE(frames.await(20));
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_EQ("", frames.firstFault());
    EXPECT_GT(frames.lost(), 0u);
}

TEST(Recording, StartsAnewWithTheFirstFrame) {
    TouchStack touchStack({"--rate", "0"});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    for (int i = 0; i < 5; ++i) {
        frames.clear();
        ASSERT_EQ(0, client->startRecord());
        EXPECT_TRUE(frames.await(100));
        EXPECT_EQ(0, client->stopRecord());
        EXPECT_EQ(0u, frames.lost());
    }
    EXPECT_EQ("", frames.firstFault());
}

TEST(Recording, EndsWithTheClientThatForgotToStopIt) {
    TouchStack touchStack;
    FrameCollector frames;
    {
        sp<TouchCompanionClient> client = frames.connect();
        ASSERT_NE(nullptr, client);
        ASSERT_EQ(0, client->startRecord());
        EXPECT_TRUE(frames.await(10));
    }
    EXPECT_TRUE(touchStack.awaitLine("client " + std::to_string(getpid()) + " unregistered"));
    const uint64_t before = frames.frames();
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    EXPECT_EQ(before, frames.frames());
}

TEST(Recording, CanBePlayedAgainBitForBit) {
    Files files;
    {
        TouchStack touchStack({"--rate", "500", "--frame-bytes", "1000", "--ring-frames", "512"});
        ASSERT_EQ(0, zelkctl({"record", "--frames", "100", "--output", files.path("once")}).status);
    }
    const struct {
        Words options;
        size_t times;
    } rows[] = {{{}, 1}, {{"--speed", "0"}, 1}, {{"--speed", "10", "--loop"}, 3}};
    for (const auto& row : rows) {
        Words options = {"--replay", files.path("once"), "--ring-frames", "512"};
        options.insert(options.end(), row.options.begin(), row.options.end());
        TouchStack touchStack(options);
        const RunResult again = zelkctl({"record", "--frames", std::to_string(100 * row.times),
                                         "--output", files.path("again")});
        EXPECT_EQ(0, again.status) << again.errors;
        std::string expected;
        for (size_t i = 0; i < row.times; ++i) {
            expected += files.read("once");
        }
        EXPECT_TRUE(expected == files.read("again")) << again.output;
    }
}

TEST(Recording, GoesToAFileOfTheServices) {
    const std::string path = "/tmp/driver_recording.frames";
    TouchStack touchStack({"--rate", "500"});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    ASSERT_EQ(0, client->setRecordOutput(0));
    ASSERT_EQ(0, client->setRecordFile(path));
    ASSERT_EQ(0, client->startRecord());
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    ASSERT_EQ(0, client->stopRecord());
    EXPECT_EQ(0u, frames.frames());

    std::ifstream file(path, std::ios::binary);
    const std::string recorded{std::istreambuf_iterator<char>(file), {}};
    unlink(path.c_str());
    uint32_t count = 0;
    for (size_t start = 0; start < recorded.size(); ++count) {
        frames::FrameHeader header;
        ASSERT_TRUE(frames::readFrameHeader(&recorded[start], recorded.size() - start, &header));
        ASSERT_EQ(count, header.sequence);
        ASSERT_LE(header.length, recorded.size() - start);
        ASSERT_STREQ(nullptr, frames::frameFault(&recorded[start], header.length));
        start += header.length;
    }
    EXPECT_GT(count, 10u);
}

TEST(Recording, IsRefusedWhenItsFileCannotBeOpened) {
    TouchStack touchStack;
    sp<TouchCompanionClient> client = new TouchCompanionClient();
    ASSERT_EQ(0, client->init());
    ASSERT_EQ(0, client->setRecordOutput(0));
    ASSERT_EQ(0, client->setRecordFile("/no/such/folder/frames"));
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, client->startRecord());
}

TEST(Recording, ServesTwoClientsAtOnce) {
    TouchStack touchStack({"--rate", "0"});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    ASSERT_EQ(0, client->startRecord());
    ChildProcess other({binary("zelkctl"), "record", "--frames", "500"});
    const std::string otherPid = std::to_string(other.pid());
    ASSERT_TRUE(touchStack.awaitLine("client " + otherPid + " records"));
    const uint64_t before = frames.frames();
    EXPECT_EQ(0, other.wait());
    EXPECT_NE(std::string::npos, other.output().find(" 0 lost in 0 gaps, 0 corrupt\n"))
            << other.output();
    EXPECT_TRUE(frames.await(before + 100));
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_EQ("", frames.firstFault());
    EXPECT_EQ(0u, frames.lost());
}

}  // namespace pemaro::test
