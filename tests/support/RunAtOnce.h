// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <thread>
#include <vector>

namespace pemaro::test {

/// Runs each function `rounds` times on a thread of its own, all of them at once; returns when all
/// have ended.
inline void runAtOnce(int rounds, const std::vector<std::function<void()>>& functions) {
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

}  // namespace pemaro::test
