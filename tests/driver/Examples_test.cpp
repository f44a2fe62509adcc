// SPDX-License-Identifier: Apache-2.0
// The example programs against the simulated touch stack.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

#include "tests/driver/DriverSetting.h"

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
