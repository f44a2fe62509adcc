// SPDX-License-Identifier: Apache-2.0
// The example programs against the simulated touch stack.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "pemaro/GestureManagerClient.h"
#include "pemaro/Status.h"
#include "tests/driver/DriverSetting.h"
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
    const RunResult refused = run({binary("zelkctl"), "session", "save"});
    EXPECT_EQ(1, refused.status);
    EXPECT_THAT(refused.errors, testing::HasSubstr(errStr(STATUS_UNSUPPORTED)));
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
