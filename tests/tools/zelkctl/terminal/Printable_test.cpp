// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Printable.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>

namespace pemaro::zelkctl {

TEST(TimeOfDay, HasThreePlacesBehindTheSecond) {
    const std::chrono::system_clock::time_point when(std::chrono::milliseconds(1'700'000'021'007));
    EXPECT_THAT(timeOfDay(when), testing::MatchesRegex("[0-9]{2}:[0-9]{2}:41\\.007"));
}

}  // namespace pemaro::zelkctl
