// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

#include "pemaro/Binder.h"
#include "tests/support/ParcelBytes.h"

namespace pemaro::test {

/// How the services treat calls from now on.
struct Order {
    static constexpr uint32_t kNoCall = 0;
    static constexpr uint32_t kAnyCall = 0xffffffff;

    /// What the transaction `code` is answered with. All others are answered with zeros, but for the
    /// companion's memory where there is to be a ring.
    Bytes reply = Bytes(16);
    uint32_t code = kAnyCall;
    bool ring = false;
    /// The transaction that gets no answer until there is another order.
    uint32_t stalled = kNoCall;
    /// The transaction in which the services die, unanswered.
    uint32_t deadly = kNoCall;
};

/// The four services as clients meet them, with the faults that a test orders. There are two kinds:
/// in this process, and in one of their own behind the real driver.
class Peer {
  public:
    static Peer& instance();

    /// The services are there and answer every call with zeros. Those that live are not made anew.
    virtual void start() = 0;

    virtual void order(const Order& order) = 0;

    /// Waits until a call is held up.
    virtual bool awaitStalled() = 0;

    /// The services die outside of any call, and nothing is behind their names any more.
    virtual void kill() = 0;

    /// The binder behind a service's name, null when there is none.
    virtual android::sp<android::IBinder> binder(const std::string& service) = 0;

  protected:
    ~Peer() = default;
};

}  // namespace pemaro::test
