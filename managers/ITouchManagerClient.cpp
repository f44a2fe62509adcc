// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "ITouchManagerClient"

#include "pemaro/ITouchManagerClient.h"

#include "managers/ManagerCall.h"
#include "pemaro/BnTouchManagerClient.h"
#include "pemaro/BpTouchManagerClient.h"

namespace pemaro {

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;

namespace {

constexpr uint32_t INJECT_GESTURE = IBinder::FIRST_CALL_TRANSACTION;

constexpr ProxyRow kGestureCallback =
        managerRow(INJECT_GESTURE, "Bp::gestureCallback", "gestureCallback() error: %s");

}  // namespace

BpTouchManagerClient::BpTouchManagerClient(const sp<IBinder>& remote)
        : BpInterface<ITouchManagerClient>(remote) {}

int BpTouchManagerClient::gestureCallback(GestureData* data) {
    return ManagerCall(LOG_TAG, kGestureCallback, descriptor).transactWithRecord(remote(), data);
}

IMPLEMENT_META_INTERFACE(TouchManagerClient, "pemaro.TouchManagerClient")

namespace {

using Client = ITouchManagerClient;

const StubRow<Client> kRows[] = {
        {"INJECT_GESTURE transact received...",
         replyRecord<&Client::gestureCallback, Client::GestureData>},
};

}  // namespace

status_t BnTouchManagerClient::onTransact(uint32_t code, const Parcel& data, Parcel* reply,
                                          uint32_t flags) {
    Client& client = *this;
    return dispatch(LOG_TAG, kRows, *this, client, code, data, reply,
                    [&] { return BBinder::onTransact(code, data, reply, flags); });
}

}  // namespace pemaro
