// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <condition_variable>
#include <cstdint>
#include <mutex>

#include "pemaro/Binder.h"
#include "tests/faults/Peer.h"

namespace pemaro::test {

/// What the faulty services of one process answer, in whichever process that is. Callable from any
/// thread.
class OrderedAnswers {
  public:
    /// Holds from now on, also for the calls that are held up: these go on.
    void order(const Order& order);

    /// Calls that are held up at this moment.
    int stalled() const;

    /// Answers a transaction when its time has come. False where the services die in it.
    bool answer(uint32_t code, android::Parcel* reply);

  private:
    mutable std::mutex mLock;
    std::condition_variable mChanged;
    Order mOrder;
    int mOrders = 0;
    int mStalled = 0;
};

}  // namespace pemaro::test
