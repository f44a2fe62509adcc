// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <memory>
#include <mutex>
#include <string>
#include <utility>

#include "pemaro/Status.h"
#include "simulator/ServiceKind.h"
#include "simulator/faults/Fault.h"
#include "simulator/managers/ManagerOptions.h"
#include "simulator/managers/SubscriberList.h"
#include "simulator/time/Ticker.h"

namespace pemaro::simulator {

/// What the simulated managers have in common: subscribers, faults, and a clock of their own.
///
/// `Stub` is the service's stub, and `kCallback` the member of `Client` that takes a `Record`. A
/// derived class answers the operations through perform(), and has a `void tick()`; it calls
/// startTicking() at the end of its constructor and shutDown() in its destructor.
template <typename Stub, typename Client, typename Record, int (Client::*kCallback)(Record*)>
class ManagerSimulator : public Stub {
  public:
    /// Faults may be ordered and withdrawn at any time.
    FaultTable& faults() { return mFaults; }

    SubscriberList::Counts counts() const { return mSubscribers->counts(); }

    /// Ends all events and forgets all subscribers.
    void shutDown() {
        mTicker.reset();
        mSubscribers->clear();
    }

    int subscribe(const android::sp<Client>& client) override {
        return performWithHandle("subscribe", client, [&](const auto& handle) {
            // The records are const here, while a callback is declared to take a plain pointer.
            return mSubscribers->add(handle, [client](const void* record) {
                return (client.get()->*kCallback)(static_cast<Record*>(const_cast<void*>(record)));
            });
        });
    }

    int unsubscribe(const android::sp<Client>& client) override {
        return performWithHandle("unsubscribe", client, [this](const auto& handle) {
            return mSubscribers->remove(handle);
        });
    }

  protected:
    ManagerSimulator(ServiceKind kind, const ManagerOptions& options)
            : mOptions(options),
              mName(shortName(kind)),
              mSubscribers(new SubscriberList(mName, options.queueRecords, options.narrate)) {}

    const ManagerOptions& options() const { return mOptions; }
    std::mutex& lock() { return mLock; }

    template <typename Simulator>
    void startTicking(double rate, Simulator* self) {
        mTicker = std::make_unique<Ticker>(rate, [self] { self->tick(); });
    }

    /// Runs an operation under the lock, unless a fault takes its place.
    template <typename Body>
    int perform(const char* operation, Body body) {
        if (const auto status = mFaults.strike(operation)) {
            return *status;
        }
        std::lock_guard<std::mutex> guard(mLock);
        return body();
    }

    /// Reports an event to all subscribers, without waiting for any.
    template <typename Layout>
    void publish(std::shared_ptr<const Layout> record) {
        static_assert(sizeof(Layout) == sizeof(Record), "a record has one size");
        mSubscribers->publish(std::move(record));
    }

    void narrate(const std::string& line) const {
        if (mOptions.narrate) {
            mOptions.narrate(std::string(mName) + ": " + line);
        }
    }

  private:
    template <typename Body>
    int performWithHandle(const char* operation, const android::sp<Client>& client, Body body) {
        return perform(operation, [&]() -> int {
            const auto handle = android::IInterface::asBinder(client);
            return handle == nullptr ? STATUS_BAD_PARAMETER : body(handle);
        });
    }

    const ManagerOptions mOptions;
    const char* const mName;
    FaultTable mFaults;
    const android::sp<SubscriberList> mSubscribers;
    std::mutex mLock;
    std::unique_ptr<Ticker> mTicker;
};

}  // namespace pemaro::simulator
