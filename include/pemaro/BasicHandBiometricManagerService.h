// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/BnHandBiometricManagerService.h"
#include "pemaro/Status.h"
#include "pemaro/Subscribers.h"

namespace pemaro {

/// A hand biometric manager that offers nothing but to report to its subscribers, to derive one from that
/// overrides what it offers. All other operations answer 0x4000000E (unsupported), which reaches the
/// client's caller; no hand is told of.
///
/// The class is all in this header.
class BasicHandBiometricManagerService : public BnHandBiometricManagerService {
  public:
    int subscribe(const android::sp<IHandBiometricManagerClient>& client) override {
        return mSubscribers.add(client);
    }
    int unsubscribe(const android::sp<IHandBiometricManagerClient>& client) override {
        return mSubscribers.remove(client);
    }
    int startEnrollment() override { return STATUS_UNSUPPORTED; }
    int stopEnrollment() override { return STATUS_UNSUPPORTED; }
    int scan() override { return STATUS_UNSUPPORTED; }
    int startMatching() override { return STATUS_UNSUPPORTED; }
    int stopMatching() override { return STATUS_UNSUPPORTED; }
    int cancelScan() override { return STATUS_UNSUPPORTED; }
    int setSecurity(int) override { return STATUS_UNSUPPORTED; }
    int setProfileName(const char*) override { return STATUS_UNSUPPORTED; }
    int deleteProfile(const char*) override { return STATUS_UNSUPPORTED; }
    int renameProfile(const char*, const char*) override { return STATUS_UNSUPPORTED; }
    int getMaxUser(unsigned int& count) override {
        count = 0;
        return STATUS_UNSUPPORTED;
    }
    int getProfileList(std::vector<std::string>&) override { return STATUS_UNSUPPORTED; }
    int enableWakeup() override { return STATUS_UNSUPPORTED; }
    int disableWakeup() override { return STATUS_UNSUPPORTED; }

  protected:
    /// Hands a record to every subscriber, one after another; those that are no more are forgotten.
    /// No lock is to be held that an operation needs: a client may take its time, or call the
    /// service from within. Any thread may call.
    void report(IHandBiometricManagerClient::HandBioData& record) {
        mSubscribers.report([&record](IHandBiometricManagerClient& client) {
            return client.handBiometricCallback(&record);
        });
    }

  private:
    Subscribers<IHandBiometricManagerClient> mSubscribers;
};

}  // namespace pemaro
