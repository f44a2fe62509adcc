// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <utility>

#include "binder/Guard.h"
#include "binder/Log.h"
#include "binder/ServiceLookup.h"
#include "pemaro/Binder.h"
#include "pemaro/Status.h"

namespace pemaro {

// How the manager clients reach their services. A client is the callback object that it subscribes
// and keeps two members for its connection, a flag and the service:
//
//   idle        flag off, no service     constructed, deinit(), or a failed init()
//   subscribed  flag on, service held    a successful init()
//   orphaned    flag on, service dead    the service's process died; deinit() leads back to idle
//
// (A touch manager client keeps the service when subscribing failed, and is not told of a death.)
// Both are reached by the caller's threads and by Binder's, and are copied and replaced under the
// guard of Guard.h; a call goes to a copy. An operation that overlaps with deinit() reaches the
// service or finds none held.

/// What distinguishes the connection of one client class from that of another. The texts of a
/// client that does not watch its service are null where they are about that.
struct ManagerTexts {
    const char* tag;
    const char* serviceName;
    const char* connected;
    const char* linkFailed;
};

/// What a client's members and texts make possible; made for the duration of a call.
template <typename Service, typename Client>
class ManagerConnection {
  public:
    using DeathRecipient = android::IBinder::DeathRecipient;

    /// Refers to all of its arguments.
    ManagerConnection(const ManagerTexts& texts, bool& initialized, android::sp<Service>& service,
                      Client* self)
            : mTexts(texts), mInitialized(initialized), mService(service), mSelf(self) {}

    /// init() of the clients that watch their service: look up, subscribe, link to its death. What
    /// had been done is undone when a step fails.
    int initWatched(DeathRecipient* watcher) {
        logText(ANDROID_LOG_DEBUG, mTexts.tag, "init: E");
        android::sp<android::IBinder> binder = awaitService(mTexts.tag, mTexts.serviceName);
        if (binder == nullptr) {
            return STATUS_ERROR_ACQUIRING_RESOURCE;
        }
        const android::sp<Service> service = hold(binder);
        if (service == nullptr) {
            return STATUS_BAD_PARAMETER;
        }
        int status = service->subscribe(mSelf);
        if (status != STATUS_NO_ERROR) {
            letGo(service);
            return refused(status);
        }
        if (binder->linkToDeath(watcher, nullptr, 0) != android::NO_ERROR) {
            logText(ANDROID_LOG_ERROR, mTexts.tag, mTexts.linkFailed);
            service->unsubscribe(mSelf);
            letGo(service);
            return STATUS_UNKNOWN_ERROR;
        }
        return connected(service);
    }

    // ---- the steps of init() ----

    /// Keeps the service behind `binder`, in place of any that was held, and returns it; null, with
    /// the reason logged, when the binder is none.
    android::sp<Service> hold(const android::sp<android::IBinder>& binder) {
        android::sp<Service> service = Service::asInterface(binder);
        exchangeGuarded(mService, service);
        if (service == nullptr) {
            logText(ANDROID_LOG_ERROR, mTexts.tag, "wrong service interface?");
        }
        return service;
    }

    int refused(int status) {
        logText(ANDROID_LOG_ERROR, mTexts.tag, "subscribing to service failed");
        return status;
    }

    /// Success is logged as an error so that it shows in every log. Who is subscribed can be reached
    /// to end that, also where a deinit() has meanwhile let the service go.
    int connected(android::sp<Service> service) {
        {
            ClientGuard guard;
            std::swap(mService, service);  // what it takes is let go outside the guard
            mInitialized = true;
        }
        logText(ANDROID_LOG_ERROR, mTexts.tag, mTexts.connected);
        return STATUS_NO_ERROR;
    }

    // ---- the rest of a client's life ----

    /// `watcher` is the one of initWatched(), null where there is none.
    int deinit(DeathRecipient* watcher) {
        logText(ANDROID_LOG_DEBUG, mTexts.tag, "deinit: E");
        const android::sp<Service> service = copyGuarded(mService);
        if (copyGuarded(mInitialized) && service != nullptr) {
            service->unsubscribe(mSelf);
            android::sp<android::IBinder> binder = android::IInterface::asBinder(service);
            if (binder != nullptr && watcher != nullptr) {
                binder->unlinkToDeath(watcher, nullptr, 0, nullptr);
            }
            letGo(service);
        }
        logText(ANDROID_LOG_DEBUG, mTexts.tag, "deinit: X");
        return STATUS_NO_ERROR;
    }

    /// Whether an event can be handed to the caller's function. Without a function it is dropped;
    /// a null context means that the caller is gone, and the client unsubscribes.
    template <typename Callback>
    bool accepts(Callback* callback, void* context, const char* callbackMissing) {
        if (callback == nullptr) {
            logText(ANDROID_LOG_ERROR, mTexts.tag, callbackMissing);
            return false;
        }
        if (context == nullptr) {
            logText(ANDROID_LOG_ERROR, mTexts.tag, "JNI context is null...unsubscribing client");
            const android::sp<Service> service = copyGuarded(mService);
            if (service != nullptr) {
                service->unsubscribe(mSelf);
            }
            return false;
        }
        return true;
    }

  private:
    /// The flag and the service at once. Not when another init() has put another service in its place.
    void letGo(const android::sp<Service>& service) {
        ClientGuard guard;
        if (mService == service) {
            mService.clear();  // the caller holds it still
            mInitialized = false;
        }
    }

    const ManagerTexts& mTexts;
    bool& mInitialized;
    android::sp<Service>& mService;
    Client* const mSelf;
};

}  // namespace pemaro
