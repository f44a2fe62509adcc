// SPDX-License-Identifier: Apache-2.0
// Recordings, over and over, use up nothing in either process.

#include <dirent.h>
#include <gtest/gtest.h>
#include <sys/types.h>
#include <unistd.h>

#include <algorithm>
#include <fstream>
#include <iterator>
#include <string>

#include "tests/driver/DriverSetting.h"
#include "tests/driver/FrameCollector.h"

using android::sp;

namespace pemaro::test {

namespace {

constexpr int kWarmUps = 10;
constexpr int kRounds = 100;
// Binder's threads and the heaps of the allocator come and go by a few; a leak is one a round.
constexpr int kLeeway = kRounds / 5;

int countEntries(const std::string& folder) {
    int count = 0;
    DIR* directory = opendir(folder.c_str());
    while (directory != nullptr && readdir(directory) != nullptr) {
        ++count;
    }
    if (directory != nullptr) {
        closedir(directory);
    }
    return count;
}

int countLines(const std::string& path) {
    std::ifstream file(path);
    return static_cast<int>(std::count(std::istreambuf_iterator<char>(file),
                                       std::istreambuf_iterator<char>(), '\n'));
}

struct Usage {
    explicit Usage(pid_t pid) {
        const std::string process = "/proc/" + std::to_string(pid);
        threads = countEntries(process + "/task");
        descriptors = countEntries(process + "/fd");
        mappings = countLines(process + "/maps");
    }

    int threads;
    int descriptors;
    int mappings;
};

void expectNoGrowth(const Usage& before, const Usage& after) {
    EXPECT_GT(before.threads, 0);
    EXPECT_GT(before.mappings, 0);
    EXPECT_LT(after.threads, before.threads + kLeeway);
    EXPECT_LT(after.descriptors, before.descriptors + kLeeway);
    EXPECT_LT(after.mappings, before.mappings + kLeeway);
}

template <typename Round>
void expectNoGrowthOver(pid_t service, Round round) {
    for (int i = 0; i < kWarmUps; ++i) {
        round();
    }
    const Usage clientBefore(getpid());
    const Usage serviceBefore(service);
    for (int i = 0; i < kRounds; ++i) {
        round();
    }
    SCOPED_TRACE("client");
    expectNoGrowth(clientBefore, Usage(getpid()));
    SCOPED_TRACE("service");
    expectNoGrowth(serviceBefore, Usage(service));
}

}  // namespace

TEST(Leaks, NoneInAHundredRecordings) {
    TouchStack touchStack({"--rate", "0"});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    expectNoGrowthOver(touchStack.process().pid(), [&] {
        frames.clear();
        ASSERT_EQ(0, client->startRecord());
        ASSERT_TRUE(frames.await(2));
        ASSERT_EQ(0, client->stopRecord());
    });
    EXPECT_EQ("", frames.firstFault());
}

TEST(Leaks, NoneInAHundredClients) {
    TouchStack touchStack({"--rate", "0"});
    expectNoGrowthOver(touchStack.process().pid(), [&] {
        FrameCollector frames;
        sp<TouchCompanionClient> client = frames.connect();
        ASSERT_NE(nullptr, client);
        ASSERT_EQ(0, client->startRecord());
        ASSERT_TRUE(frames.await(1));
        ASSERT_EQ(0, client->stopRecord());
    });
}

}  // namespace pemaro::test
