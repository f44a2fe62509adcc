// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/IHandBiometricManagerClient.h"

namespace pemaro {

/// Proxy of IHandBiometricManagerClient, through which the service reports to a client. Callable
/// from any thread.
class ZELK_API BpHandBiometricManagerClient
        : public android::BpInterface<IHandBiometricManagerClient> {
  public:
    /// A proxy of the object behind `remote`, which may be of any process.
    explicit BpHandBiometricManagerClient(const android::sp<android::IBinder>& remote);

    int handBiometricCallback(HandBioData* data) override;
};

}  // namespace pemaro
