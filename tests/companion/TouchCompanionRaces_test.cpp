// SPDX-License-Identifier: Apache-2.0
// Operations of one client at once. What is tested is that nothing is used after it was let go: by
// the sanitizers, and by the counts at the end.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/companion/TouchCompanionClientTest.h"
#include "tests/support/RunAtOnce.h"

namespace pemaro::test {
namespace {

using android::sp;

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
