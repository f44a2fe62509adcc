// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <mutex>
#include <vector>

namespace pemaro::test {

/// A service in the test's own process that clients can watch, as they watch one in another process.
/// The platform gives no death notices about a local binder, so that a GestureManagerClient or a
/// HandBiometricManagerClient fails to initialise against a plain one.
///
///     class Gestures : public BasicGestureManagerService { ... };
///
///     const sp<Watchable<Gestures>> service = new Watchable<Gestures>;
///     services->add("pemaro.GestureManagerService", service);
///     EXPECT_EQ(STATUS_NO_ERROR, client->init());
///     service->die();                                // the death callback runs, on this thread
///     EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->enableWakeup());
///
/// Clients reach it through a proxy, so that their calls fail from its death on. What else has a
/// reference may call it directly as before. Callable from any thread.
template <typename Service>
class Watchable : public Service {
  public:
    /// Who is told of a death.
    using DeathRecipient = android::IBinder::DeathRecipient;

    /// A watch, with the arguments of its linkToDeath().
    struct DeathLink {
        android::wp<DeathRecipient> recipient;  ///< who is told
        void* cookie;                           ///< as given
        uint32_t flags;                         ///< as given
    };

    /// Constructed as the service is.
    using Service::Service;

    /// The service's process dies: who watches it now is told, once, on this thread; from now on
    /// transactions, pings and further watches are answered with DEAD_OBJECT.
    void die() {
        std::vector<DeathLink> links;
        {
            const std::lock_guard<std::mutex> lock(mLinksLock);
            mAlive = false;
            links.swap(mLinks);
        }
        for (const DeathLink& link : links) {
            const android::sp<DeathRecipient> recipient = link.recipient.promote();
            if (recipient != nullptr) {
                recipient->binderDied(android::wp<android::IBinder>(this));
            }
        }
    }

    /// The watches at this moment.
    std::vector<DeathLink> links() const {
        const std::lock_guard<std::mutex> lock(mLinksLock);
        return mLinks;
    }

    /// No interface is local: each is reached by a proxy.
    android::sp<android::IInterface> queryLocalInterface(const android::String16&) override {
        return nullptr;
    }

    /// Until die().
    bool isBinderAlive() const override {
        const std::lock_guard<std::mutex> lock(mLinksLock);
        return mAlive;
    }

    /// OK until die().
    android::status_t pingBinder() override { return isBinderAlive() ? android::OK : kDead; }

    /// Keeps a watch, as often as it is asked to.
    android::status_t linkToDeath(const android::sp<DeathRecipient>& recipient,
                                  void* cookie = nullptr, uint32_t flags = 0) override {
        const std::lock_guard<std::mutex> lock(mLinksLock);
        if (!mAlive) {
            return kDead;
        }
        mLinks.push_back({recipient, cookie, flags});
        return android::OK;
    }

    /// Ends one watch, by its recipient, or by its cookie where no recipient is given.
    android::status_t unlinkToDeath(const android::wp<DeathRecipient>& recipient,
                                    void* cookie = nullptr, uint32_t /* flags */ = 0,
                                    android::wp<DeathRecipient>* outRecipient = nullptr) override {
        const std::lock_guard<std::mutex> lock(mLinksLock);
        if (!mAlive) {
            return kDead;
        }
        const auto found = std::find_if(mLinks.begin(), mLinks.end(), [&](const DeathLink& link) {
            return link.recipient == recipient || (recipient == nullptr && link.cookie == cookie);
        });
        if (found == mLinks.end()) {
            return android::NAME_NOT_FOUND;
        }
        if (outRecipient != nullptr) {
            *outRecipient = found->recipient;
        }
        mLinks.erase(found);
        return android::OK;
    }

  protected:
    /// What the service answers, until die().
    android::status_t onTransact(uint32_t code, const android::Parcel& data, android::Parcel* reply,
                                 uint32_t flags = 0) override {
        return isBinderAlive() ? Service::onTransact(code, data, reply, flags) : kDead;
    }

  private:
    static constexpr android::status_t kDead = android::DEAD_OBJECT;

    mutable std::mutex mLinksLock;
    std::vector<DeathLink> mLinks;
    bool mAlive = true;
};

}  // namespace pemaro::test
