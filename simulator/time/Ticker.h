// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>

namespace pemaro::simulator {

/// Calls a function at a fixed rate, from a thread of its own, as long as it lives.
class Ticker {
  public:
    /// `rate` is in calls a second; there are none at 0. The first comes after one period.
    Ticker(double rate, std::function<void()> onTick);

    /// Waits for a call under way.
    ~Ticker();
    Ticker(const Ticker&) = delete;
    Ticker& operator=(const Ticker&) = delete;

  private:
    void run(double rate);

    const std::function<void()> mOnTick;
    std::mutex mLock;
    std::condition_variable mChanged;
    bool mStopping = false;
    std::thread mThread;
};

}  // namespace pemaro::simulator
