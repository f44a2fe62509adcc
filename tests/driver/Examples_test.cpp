// SPDX-License-Identifier: Apache-2.0
// The example programs against the simulated touch stack.

#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <chrono>
#include <future>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "binder/PlatformShims.h"
#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/GestureManagerClient.h"
#include "pemaro/ITouchCompanionService.h"
#include "pemaro/Status.h"
#include "pemaro/TouchCompanionSharedCblk.h"
#include "tests/driver/DriverSetting.h"
#include "tests/support/ConditionWords.h"
#include "tests/support/RecordCollector.h"

using testing::MatchesRegex;

namespace pemaro::test {

TEST(Examples, FacadeByName) {
    TouchStack stack;
    const RunResult result = run({binary("facade_by_name"), ZELK_LIBRARY});
    EXPECT_EQ(0, result.status) << result.errors;
    EXPECT_THAT(result.output,
                MatchesRegex("gain is 1.500000\nreport.rate is 240\ncalibrate 3 0x10: done\n"
                             "recorded [1-9][0-9]* frames, [1-9][0-9]* bytes\n"));
}

TEST(Examples, ClientLinked) {
    TouchStack stack;
    const RunResult result = run({binary("client_linked")});
    EXPECT_EQ(0, result.status) << result.errors;
    EXPECT_THAT(result.output, MatchesRegex("packet size 4096, configuration of [0-9]+ bytes\n"
                                            "status: filter=3 events=0 authenticated=no\n"
                                            "recorded [1-9][0-9]* frames, [1-9][0-9]* bytes\n"));
}

// A program of the tutorial for service authors, until it is registered.
class Service {
  public:
    Service(const std::string& program, const std::vector<std::string>& probe)
            : mProcess({binary(program)}) {
        while (mProcess.isRunning() && run(probe).status != 0) {
        }
        EXPECT_TRUE(mProcess.isRunning()) << mProcess.errors();
    }

  private:
    ChildProcess mProcess;
};

TEST(ExampleServices, RecordIntoTheRing) {
    Service service("companion_service", {binary("zelkctl"), "ping"});
    const RunResult linked = run({binary("client_linked")});
    EXPECT_EQ(0, linked.status) << linked.errors;
    EXPECT_THAT(linked.output, MatchesRegex("packet size 64, configuration of 7 bytes\n"
                                            "status: ready\n"
                                            "recorded [1-9][0-9]* frames, [1-9][0-9]* bytes\n"));
    // Once more: the first recording has left nothing behind.
    EXPECT_EQ(linked.status, run({binary("client_linked")}).status);
    // As the tutorial has it.
    const RunResult recorded = run({binary("zelkctl"), "record", "--frames", "5"});
    EXPECT_EQ(0, recorded.status) << recorded.errors;
    EXPECT_THAT(recorded.output + recorded.errors,
                testing::HasSubstr("no sequence numbers, 0 corrupt"));
    const RunResult refused = run({binary("zelkctl"), "session", "save"});
    EXPECT_EQ(1, refused.status);
    EXPECT_THAT(refused.errors, testing::HasSubstr(errStr(STATUS_UNSUPPORTED)));
}

// Records from whatever companion serves, as a client does that is killed in its wait: the writer stays
// in the signal of its first frame. True when the service stops that recording all the same.
bool stopsWithoutItsWriter() {
    android::sp<ITouchCompanionService> service;
    EXPECT_EQ(android::OK, android::getService(android::String16("pemaro.TouchService"), &service));
    service->registerClient(new BnTouchCompanionClient);
    service->open();
    service->setRecordParameter(1);
    service->prepareRecord();
    const android::sp<android::IMemory> memory = service->getCblk();
    auto* const block = static_cast<TouchCompanionSharedCblk*>(mappedAddress(memory));
    dieInWait(block->cond);
    EXPECT_EQ(0, service->startRecord());
    while (TouchCompanionSharedCblk::acquireIndex(block->write) == 0) {
        usleep(1000);
    }
    // Should it not come through, the service's end sets the thread free.
    std::promise<int> stopped;
    std::future<int> status = stopped.get_future();
    std::thread([service, stopped = std::move(stopped)]() mutable {
        stopped.set_value(service->stopRecord());
    }).detach();
    const bool inTime = status.wait_for(std::chrono::seconds(15)) == std::future_status::ready;
    EXPECT_EQ(1u, TouchCompanionSharedCblk::acquireIndex(block->write)) << "nothing held it up";
    return inTime && status.get() == 0;
}

TEST(ExampleServices, OutliveAClientThatDiedWithTheConditionsLock) {
    Service service("companion_service", {binary("zelkctl"), "ping"});
    ASSERT_TRUE(stopsWithoutItsWriter());
    const RunResult next = run({binary("client_linked")});
    EXPECT_EQ(0, next.status) << next.errors;
    EXPECT_THAT(next.output, testing::HasSubstr("\nrecorded "));
}

TEST(SimulatedStack, OutlivesAClientThatDiedWithTheConditionsLock) {
    TouchStack stack;
    ASSERT_TRUE(stopsWithoutItsWriter());
    const RunResult next = run({binary("zelkctl"), "record", "--frames", "5"});
    EXPECT_EQ(0, next.status) << next.errors;
}

TEST(ExampleServices, ReportGestures) {
    Service service("gesture_service", {binary("zelkctl"), "gesture", "limits"});
    ASSERT_EQ(0, run({binary("zelkctl"), "gesture", "detect", "start"}).status);
    RecordCollector events;
    const android::sp<GestureManagerClient> client =
            new GestureManagerClient(RecordCollector::onEvent<IGestureManagerClient::GestureData>,
                                     RecordCollector::onDeath, &events);
    ASSERT_EQ(0, client->init());
    EXPECT_TRUE(events.await(3));
    IGestureManagerClient::GestureData sample = {};
    int gesture = 0;
    EXPECT_EQ(0, client->addGesture(1, &sample, gesture));
    EXPECT_EQ(1, gesture);
    EXPECT_EQ(0, client->deleteGesture(gesture));
    EXPECT_EQ(STATUS_BAD_PARAMETER, client->deleteGesture(gesture));
    EXPECT_EQ(STATUS_UNSUPPORTED, client->enableGesture(gesture));
    EXPECT_EQ(0, client->deinit());
}

TEST(Examples, FailWhenTheServiceRefuses) {
    TouchStack stack({"--fault", "startRecord=status:0x40000010"});
    const RunResult byName = run({binary("facade_by_name"), ZELK_LIBRARY});
    EXPECT_EQ(1, byName.status);
    EXPECT_THAT(byName.errors,
                testing::HasSubstr("facade_by_name: starting the recording failed with status "
                                   "0x40000010\n"));
    const RunResult linked = run({binary("client_linked")});
    EXPECT_EQ(1, linked.status);
    EXPECT_THAT(linked.errors, testing::HasSubstr("client_linked: starting the recording: Error "
                                                  "involving AFE HAL\n"));
}

}  // namespace pemaro::test
