// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <algorithm>
#include <mutex>
#include <vector>

#include "pemaro/Status.h"

namespace pemaro {

/// The clients that a manager reports to, for who implements one; `Client` is their interface, as
/// IGestureManagerClient.
///
///     return mSubscribers.add(client);                                  // in subscribe()
///     return mSubscribers.remove(client);                               // in unsubscribe()
///     mSubscribers.report([&](Client& client) { return client.gestureCallback(&gesture); });
///
/// A client arrives as another proxy each time; two are the same when their binders are. Any thread
/// may call. The class is all in this header.
template <typename Client>
class Subscribers {
  public:
    /// Keeps a reference to the client; 0, or 0x4000000D for null. One that is there already is
    /// there once.
    int add(const android::sp<Client>& client) {
        if (client == nullptr) {
            return STATUS_BAD_PARAMETER;
        }
        const std::lock_guard<std::mutex> guard(mLock);
        if (find(client) == mClients.end()) {
            mClients.push_back(client);
        }
        return STATUS_NO_ERROR;
    }

    /// Lets go of the client; 0, or 0x40000019 for one that is not there.
    int remove(const android::sp<Client>& client) {
        const std::lock_guard<std::mutex> guard(mLock);
        const auto place = find(client);
        if (place == mClients.end()) {
            return STATUS_NOT_FOUND;
        }
        mClients.erase(place);
        return STATUS_NO_ERROR;
    }

    /// How many there are.
    size_t size() const {
        const std::lock_guard<std::mutex> guard(mLock);
        return mClients.size();
    }

    /// Calls `call` with each client, one after another and with no lock held: a client may take
    /// its time, or call the service from within. One that it returns 0x40000000 for, as a proxy
    /// does when a call does not get through, is let go of when its process is no more. A client
    /// that is alive and too slow, so that a call finds no room, has lost that report and no other.
    template <typename Call>
    void report(Call call) {
        for (const android::sp<Client>& client : clients()) {
            if (call(*client) == STATUS_UNKNOWN_ERROR &&
                !android::IInterface::asBinder(client)->isBinderAlive()) {
                remove(client);
            }
        }
    }

  private:
    using Clients = std::vector<android::sp<Client>>;

    Clients clients() const {
        const std::lock_guard<std::mutex> guard(mLock);
        return mClients;
    }

    typename Clients::iterator find(const android::sp<Client>& client) {
        return std::find_if(mClients.begin(), mClients.end(),
                            [&](const android::sp<Client>& other) {
                                return android::IInterface::asBinder(other) ==
                                       android::IInterface::asBinder(client);
                            });
    }

    mutable std::mutex mLock;
    Clients mClients;
};

}  // namespace pemaro
