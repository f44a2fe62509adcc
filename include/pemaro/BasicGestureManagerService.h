// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/BnGestureManagerService.h"
#include "pemaro/Status.h"
#include "pemaro/Subscribers.h"

namespace pemaro {

/// A gesture manager that offers nothing but to report to its subscribers, to derive one from that
/// overrides what it offers. All other operations answer 0x4000000E (unsupported), which reaches the
/// client's caller; numbers that they would tell are 0.
///
/// The class is all in this header.
class BasicGestureManagerService : public BnGestureManagerService {
  public:
    int subscribe(const android::sp<IGestureManagerClient>& client) override {
        return mSubscribers.add(client);
    }
    int unsubscribe(const android::sp<IGestureManagerClient>& client) override {
        return mSubscribers.remove(client);
    }
    int enableWakeup() override { return STATUS_UNSUPPORTED; }
    int disableWakeup() override { return STATUS_UNSUPPORTED; }
    int startGestureDetection() override { return STATUS_UNSUPPORTED; }
    int stopGestureDetection() override { return STATUS_UNSUPPORTED; }
    int addGesture(int, IGestureManagerClient::GestureData*, int& result) override {
        result = 0;
        return STATUS_UNSUPPORTED;
    }
    int deleteGesture(int) override { return STATUS_UNSUPPORTED; }
    int enableGesture(int) override { return STATUS_UNSUPPORTED; }
    int disableGesture(int) override { return STATUS_UNSUPPORTED; }
    int improveGestureTraining(IGestureManagerClient::GestureData*, int& result) override {
        result = 0;
        return STATUS_UNSUPPORTED;
    }
    int getMaxPreDefinedGesture(unsigned int& count) override {
        count = 0;
        return STATUS_UNSUPPORTED;
    }
    int getMaxUserDefinedGesture(unsigned int& count) override {
        count = 0;
        return STATUS_UNSUPPORTED;
    }

  protected:
    /// Hands a record to every subscriber, one after another; those that are no more are forgotten.
    /// No lock is to be held that an operation needs: a client may take its time, or call the
    /// service from within. Any thread may call.
    void report(IGestureManagerClient::GestureData& record) {
        mSubscribers.report([&record](IGestureManagerClient& client) {
            return client.gestureCallback(&record);
        });
    }

  private:
    Subscribers<IGestureManagerClient> mSubscribers;
};

}  // namespace pemaro
