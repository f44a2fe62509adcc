// SPDX-License-Identifier: Apache-2.0
#include "simulator/time/Ticker.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <future>
#include <thread>

namespace pemaro::simulator {

TEST(Ticker, CallsAgainAndAgain) {
    std::atomic<int> calls{0};
    std::promise<void> enough;
    Ticker ticker(1000, [&] {
        if (++calls == 20) {
            enough.set_value();
        }
    });
    EXPECT_EQ(std::future_status::ready, enough.get_future().wait_for(std::chrono::seconds(60)));
}

TEST(Ticker, NeverCallsAtRateZero) {
    std::atomic<int> calls{0};
    {
        Ticker ticker(0, [&] { ++calls; });
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
    EXPECT_EQ(0, calls);
}

TEST(Ticker, EndsBetweenTwoCallsWithoutWaitingForTheNext) {
    std::atomic<int> calls{0};
    const auto start = std::chrono::steady_clock::now();
    {
        Ticker ticker(0.001, [&] { ++calls; });
    }
    EXPECT_GT(std::chrono::seconds(500), std::chrono::steady_clock::now() - start);
    EXPECT_EQ(0, calls);
}

}  // namespace pemaro::simulator
