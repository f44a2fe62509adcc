// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/CallSummary.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <random>
#include <vector>

#include "tests/tools/zelkctl/trace/SomeCall.h"

using testing::ElementsAre;

namespace pemaro::zelkctl {

TEST(Durations, AreExactAsLongAsTheyAreSmall) {
    Durations durations;
    EXPECT_TRUE(durations.isEmpty());
    for (int64_t i = 1; i <= 100; ++i) {
        durations.add(i);
    }
    EXPECT_EQ(50, durations.percentile(50));
    EXPECT_EQ(99, durations.percentile(99));
    EXPECT_EQ(1, durations.percentile(0));
    EXPECT_EQ(100, durations.percentile(100));
    EXPECT_EQ(100, durations.longest());
}

TEST(Durations, AreKnownToOnePartIn64) {
    std::mt19937_64 random(8);
    std::vector<int64_t> values;
    Durations durations;
    for (int i = 0; i < 5000; ++i) {
        // Of all magnitudes.
        values.push_back(static_cast<int64_t>(random() >> (1 + random() % 60)));
        durations.add(values.back());
    }
    std::sort(values.begin(), values.end());
    for (const int percent : {1, 10, 50, 90, 99, 100}) {
        const int64_t exact = values[static_cast<size_t>(percent) * values.size() / 100 - 1];
        EXPECT_GE(durations.percentile(percent), exact);
        EXPECT_LE(durations.percentile(percent) - exact, exact / 64) << percent;
    }
    EXPECT_EQ(values.back(), durations.longest());
    durations.add(std::numeric_limits<int64_t>::max());
    EXPECT_EQ(std::numeric_limits<int64_t>::max(), durations.percentile(100));
}

TEST(CallSummary, CountsTheCallsOfEachOperation) {
    CallSummary summary;
    summary.add(openCall());
    TracedCall call = someCall();
    call.code = 5;
    summary.add(call);
    call.returned += 1'000'000;
    call.end = CallEnd::kDead;
    summary.add(call);
    EXPECT_EQ(3u, summary.calls());
    EXPECT_EQ(1u, summary.failed());
    EXPECT_THAT(summary.table(),
                ElementsAre("   calls  failed           p50           p99           max        sent"
                            "    received  operation",
                            "       2       1      0.504 ms      1.500 ms      1.500 ms         112"
                            "          16  touch.enable",
                            "       1       0             -             -             -          56"
                            "           0  touch.isSupported"));
    EXPECT_THAT(
            summary.jsonLines(),
            ElementsAre(R"({"service":"touch","interface":"pemaro.TouchManagerService",)"
                        R"("operation":"enable","code":5,"calls":2,"failed":1,"request":112,)"
                        R"("reply":16,"p50":0.000504,"p99":0.0015,"max":0.0015})",
                        R"({"service":"touch","interface":"pemaro.TouchManagerService",)"
                        R"("operation":"isSupported","code":3,"calls":1,"failed":0,"request":56,)"
                        R"("reply":0})"));
}

}  // namespace pemaro::zelkctl
