// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "pemaro/Binder.h"
#include "pemaro/IHandBiometricManagerService.h"

namespace pemaro {

/// Proxy of IHandBiometricManagerService; see there for what each operation returns. Callable from
/// any thread.
class ZELK_API BpHandBiometricManagerService
        : public android::BpInterface<IHandBiometricManagerService> {
  public:
    /// A proxy of the object behind `remote`, which may be of any process.
    explicit BpHandBiometricManagerService(const android::sp<android::IBinder>& remote);

    int subscribe(const android::sp<IHandBiometricManagerClient>& client) override;
    int unsubscribe(const android::sp<IHandBiometricManagerClient>& client) override;
    int startEnrollment() override;
    int stopEnrollment() override;
    int scan() override;
    int startMatching() override;
    int stopMatching() override;
    int cancelScan() override;
    int setSecurity(int level) override;
    int setProfileName(const char* name) override;
    int deleteProfile(const char* name) override;
    int renameProfile(const char* first, const char* second) override;
    int getMaxUser(unsigned int& count) override;
    int getProfileList(std::vector<std::string>& names) override;
    int enableWakeup() override;
    int disableWakeup() override;
};

}  // namespace pemaro
