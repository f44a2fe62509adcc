// SPDX-License-Identifier: Apache-2.0
#include "pemaro/ITouchCompanionClient.h"

#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/BpTouchCompanionClient.h"

namespace pemaro {

BpTouchCompanionClient::BpTouchCompanionClient(const android::sp<android::IBinder>& remote)
        : BpInterface<ITouchCompanionClient>(remote) {}

IMPLEMENT_META_INTERFACE(TouchCompanionClient, "pemaro.TouchServiceClient")

android::status_t BnTouchCompanionClient::onTransact(uint32_t code, const android::Parcel& data,
                                                     android::Parcel* reply, uint32_t flags) {
    if (!data.checkInterface(this)) {
        return android::PERMISSION_DENIED;
    }
    return BBinder::onTransact(code, data, reply, flags);
}

}  // namespace pemaro
