// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/IGestureManagerService.h"

namespace pemaro {

/// Proxy of IGestureManagerService; see there for what each operation returns. Callable from
/// any thread.
class ZELK_API BpGestureManagerService : public android::BpInterface<IGestureManagerService> {
  public:
    /// A proxy of the object behind `remote`, which may be of any process.
    explicit BpGestureManagerService(const android::sp<android::IBinder>& remote);

    int subscribe(const android::sp<IGestureManagerClient>& client) override;
    int unsubscribe(const android::sp<IGestureManagerClient>& client) override;
    int enableWakeup() override;
    int disableWakeup() override;
    int startGestureDetection() override;
    int stopGestureDetection() override;
    int addGesture(int count, IGestureManagerClient::GestureData* samples, int& result) override;
    int deleteGesture(int gesture) override;
    int enableGesture(int gesture) override;
    int disableGesture(int gesture) override;
    int improveGestureTraining(IGestureManagerClient::GestureData* sample, int& result) override;
    int getMaxPreDefinedGesture(unsigned int& count) override;
    int getMaxUserDefinedGesture(unsigned int& count) override;
};

}  // namespace pemaro
