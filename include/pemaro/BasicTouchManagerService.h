// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/BnTouchManagerService.h"
#include "pemaro/Status.h"
#include "pemaro/Subscribers.h"

namespace pemaro {

/// A touch manager that offers nothing but to report to its subscribers, to derive one from that
/// overrides what it offers. All other operations answer 0x4000000E (unsupported), which reaches the
/// client's caller; no feature is told to be there.
///
/// The class is all in this header.
class BasicTouchManagerService : public BnTouchManagerService {
  public:
    int subscribe(const android::sp<ITouchManagerClient>& client) override {
        return mSubscribers.add(client);
    }
    int unsubscribe(const android::sp<ITouchManagerClient>& client) override {
        return mSubscribers.remove(client);
    }
    int isSupported(int, bool& supported) override {
        supported = false;
        return STATUS_UNSUPPORTED;
    }
    int isEnabled(int, bool& enabled) override {
        enabled = false;
        return STATUS_UNSUPPORTED;
    }
    int enable(int) override { return STATUS_UNSUPPORTED; }
    int disable(int) override { return STATUS_UNSUPPORTED; }
    int configure_vm_region(android::Rect&, bool) override { return STATUS_UNSUPPORTED; }

  protected:
    /// Hands a record to every subscriber, one after another; those that are no more are forgotten.
    /// No lock is to be held that an operation needs: a client may take its time, or call the
    /// service from within. Any thread may call.
    void report(ITouchManagerClient::GestureData& record) {
        mSubscribers.report(
                [&record](ITouchManagerClient& client) { return client.gestureCallback(&record); });
    }

  private:
    Subscribers<ITouchManagerClient> mSubscribers;
};

}  // namespace pemaro
