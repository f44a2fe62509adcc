// SPDX-License-Identifier: Apache-2.0
// Operations of one client at once. What is tested is that nothing is used after it was let go: by
// the sanitizers, and by the counts at the end.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <thread>
#include <vector>

#include "tests/companion/TouchCompanionClientTest.h"

namespace pemaro::test {
namespace {

using android::sp;

void runAtOnce(int rounds, const std::vector<std::function<void()>>& functions) {
    std::vector<std::thread> threads;
    for (const auto& function : functions) {
        threads.emplace_back([rounds, &function] {
            for (int round = 0; round < rounds; ++round) {
                function();
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
}

TEST_F(TouchCompanionClientTest, UsesNothingThatWasLetGoWhileOthersInit) {
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    runAtOnce(200, {
                           [&] {
                               client->init();
                               clearLog();
                               mService->clearCalls();
                           },
                           [&] { client->init(); },
                           [&] { client->pingService(); },
                           [&] { client->sendEvent(eventType(1), eventParam(2)); },
                           [&] { client->setRecordOutput(0); },
                           [&] { client->setRecordFile("/f"); },
                           [&] { client->setRecordFilter(1); },
                           [&] {
                               size_t length = 0;
                               client->getConfigParams(nullptr, &length);
                           },
                   });
    EXPECT_EQ(1, client->pingService());
}

TEST_F(TouchCompanionClientTest, UsesNoBlockThatWasLetGoByAnotherThread) {
    FrameRing ring(8, 64);
    FakeWaits waits;
    Frames frames;
    sp<TouchCompanionClient> client = record(ring, Frames::callback, &frames);
    runAtOnce(100, {
                           [&] { client->startRecord(); },
                           [&] { client->startRecord(); },
                           [&] {
                               client->stopRecord();
                               clearLog();
                               mService->clearCalls();
                           },
                           [&] { client->setRecordOutput(1); },
                   });
    client->stopRecord();
    const size_t before = frames.count();
    ring.put();
    usleep(20000);
    EXPECT_EQ(before, frames.count()) << "no thread was left";
    client.clear();
    mService->cblk = nullptr;
    EXPECT_EQ(1, ring.memory()->getStrongCount());
}

}  // namespace
}  // namespace pemaro::test
