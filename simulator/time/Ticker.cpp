// SPDX-License-Identifier: Apache-2.0
#include "simulator/time/Ticker.h"

#include <algorithm>
#include <chrono>
#include <utility>

namespace pemaro::simulator {

using Clock = std::chrono::steady_clock;

Ticker::Ticker(double rate, std::function<void()> onTick) : mOnTick(std::move(onTick)) {
    if (rate > 0) {
        mThread = std::thread([this, rate] { run(rate); });
    }
}

Ticker::~Ticker() {
    {
        std::lock_guard<std::mutex> guard(mLock);
        mStopping = true;
        mChanged.notify_all();
    }
    if (mThread.joinable()) {
        mThread.join();
    }
}

void Ticker::run(double rate) {
    const auto period =
            std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(1.0 / rate));
    Clock::time_point next = Clock::now() + period;
    std::unique_lock<std::mutex> guard(mLock);
    while (!mChanged.wait_until(guard, next, [this] { return mStopping; })) {
        guard.unlock();
        mOnTick();
        guard.lock();
        // One that was held up goes on from now instead of catching up.
        next = std::max(next + period, Clock::now());
    }
}

}  // namespace pemaro::simulator
