// SPDX-License-Identifier: Apache-2.0
#include "binder/Log.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/support/LogLines.h"

namespace pemaro::test {
namespace {

TEST(Log, WritesATextAsItStands) {
    clearLog();
    logText(ANDROID_LOG_DEBUG, "Tag", "100 %s");
    logText(ANDROID_LOG_ERROR, "Tag", "");
    EXPECT_THAT(linesOf("Tag"), ::testing::ElementsAre("D 100 %s", "E "));
}

TEST(Log, WritesNothingForANullText) {
    clearLog();
    logText(ANDROID_LOG_ERROR, "Tag", nullptr);
    EXPECT_THAT(linesOf("Tag"), ::testing::IsEmpty());
}

}  // namespace
}  // namespace pemaro::test
