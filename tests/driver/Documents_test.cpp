// SPDX-License-Identifier: Apache-2.0
// The programs that stand in the documents, against the simulated touch stack.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <string>

#include "tests/driver/DriverSetting.h"

using testing::EndsWith;
using testing::MatchesRegex;

namespace pemaro::test {

TEST(Documents, ManualLinked) {
    TouchStack stack;
    const RunResult result = run({binary("manual_watch")});
    EXPECT_EQ(0, result.status) << result.errors;
    EXPECT_THAT(result.output, MatchesRegex("[1-9][0-9]* frames, [1-9][0-9]* gestures\n"));
}

TEST(Documents, ManualLinkedTellsWhatFailed) {
    TouchStack stack({"--fault", "gesture.startGestureDetection=status:0x40000010"});
    const RunResult result = run({binary("manual_watch")});
    EXPECT_EQ(1, result.status);
    // Behind the log of the library.
    EXPECT_THAT(result.errors, EndsWith("\ndetection: Error involving AFE HAL\n"));
}

TEST(Documents, ManualByName) {
    TouchStack stack;
    const RunResult result = run({binary("manual_by_name"), ZELK_LIBRARY});
    EXPECT_EQ(0, result.status) << result.errors;
    EXPECT_THAT(result.output,
                MatchesRegex("status 0x0, [1-9][0-9]* frames, [1-9][0-9]* gestures\n"));
}

TEST(Documents, CheckOfAFileOfFrames) {
    TouchStack stack;
    const std::string file = "/tmp/frames-" + std::to_string(getpid());
    const RunResult recording =
            run({binary("zelkctl"), "record", "--frames", "20", "--output", file});
    EXPECT_EQ(0, recording.status) << recording.errors;
    const RunResult result = run({"python3", ZELK_DOCUMENT_PROGRAMS "/check_frames.py", file});
    EXPECT_EQ("20 frames\n", result.output) << result.errors;
    unlink(file.c_str());
}

}  // namespace pemaro::test
