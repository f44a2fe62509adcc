// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/EventReceiver.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <stdlib.h>
#include <time.h>
#include <unistd.h>

#include <fstream>
#include <iterator>
#include <string>

using testing::MatchesRegex;

namespace pemaro::zelkctl {

namespace {

using testing::internal::CaptureStdout;
using testing::internal::GetCapturedStdout;

constexpr std::chrono::milliseconds kNoPatience(0);

struct Record {
    char bytes[9];
};

// 2026-11-20 19:14:05.067 UTC.
const std::chrono::system_clock::time_point kWhen{std::chrono::milliseconds(1795202045067)};

Record numbers() {
    return {{'1', '2', '3', '4', '5', '6', '7', '8', '9'}};
}

}  // namespace

TEST(EventLine, TellsTimeSizeAndDigest) {
    setenv("TZ", "UTC", 1);
    tzset();
    EXPECT_EQ("19:14:05.067  9 bytes  cbf43926", eventLine(kWhen, "123456789", 9, false));
    EXPECT_EQ("{\"time\":1795202045.067,\"size\":9,\"digest\":\"cbf43926\"}",
              eventLine(kWhen, "123456789", 9, true));
}

TEST(EventLine, OfAnEventWithoutARecord) {
    EXPECT_EQ("{\"time\":1795202045.067,\"size\":0,\"digest\":\"00000000\"}",
              eventLine(kWhen, nullptr, 0, true));
}

TEST(EventLine, OfTheServiceItself) {
    setenv("TZ", "UTC", 1);
    tzset();
    EXPECT_EQ("19:14:05.067  the service died", serviceLine(kWhen, "died", false));
    EXPECT_EQ("{\"time\":1795202045.067,\"service\":\"is back\"}",
              serviceLine(kWhen, "is back", true));
}

TEST(EventReceiver, PrintsALineForEachEventUpToItsLimit) {
    EventReceiver receiver(nullptr, 2, true);
    Record record = numbers();
    CaptureStdout();
    EventReceiver::onEvent(&record, &receiver);
    EXPECT_FALSE(receiver.waitUntilDone(kNoPatience));
    EventReceiver::onEvent<Record>(nullptr, &receiver);
    EXPECT_TRUE(receiver.waitUntilDone(kNoPatience));
    EventReceiver::onEvent(&record, &receiver);
    EXPECT_THAT(GetCapturedStdout(),
                MatchesRegex("\\{\"time\":[0-9.]+,\"size\":9,\"digest\":\"cbf43926\"\\}\n"
                             "\\{\"time\":[0-9.]+,\"size\":0,\"digest\":\"00000000\"\\}\n"));
    EXPECT_EQ(2u, receiver.close());
}

TEST(EventReceiver, TakesNothingOnceClosed) {
    EventReceiver receiver(nullptr, 0, false);
    Record record = numbers();
    CaptureStdout();
    EXPECT_EQ(0u, receiver.close());
    EventReceiver::onEvent(&record, &receiver);
    EXPECT_EQ("", GetCapturedStdout());
    EXPECT_EQ(0u, receiver.close());
}

TEST(EventReceiver, KeepsTheRecordsOneAfterAnother) {
    const std::string path = testing::TempDir() + "EventReceiver_test." + std::to_string(getpid());
    frames::FrameFile file;
    ASSERT_TRUE(file.open(path));
    EventReceiver receiver(&file, 0, false);
    Record record = numbers();
    CaptureStdout();
    EventReceiver::onEvent(&record, &receiver);
    EventReceiver::onEvent<Record>(nullptr, &receiver);
    EventReceiver::onEvent(&record, &receiver);
    GetCapturedStdout();
    EXPECT_EQ(3u, receiver.close());
    EXPECT_TRUE(file.close());
    std::ifstream stream(path, std::ios::binary);
    EXPECT_EQ("123456789123456789", std::string(std::istreambuf_iterator<char>(stream), {}));
    unlink(path.c_str());
}

TEST(EventReceiver, IsDoneWhenItCannotKeepARecord) {
    frames::FrameFile file;
    ASSERT_TRUE(file.open("/dev/full"));
    EventReceiver receiver(&file, 0, false);
    Record record = numbers();
    CaptureStdout();
    EventReceiver::onEvent(&record, &receiver);
    EXPECT_EQ("", GetCapturedStdout());
    EXPECT_TRUE(receiver.waitUntilDone(kNoPatience));
    EXPECT_EQ(0u, receiver.close());
    EXPECT_FALSE(file.close());
}

}  // namespace pemaro::zelkctl
