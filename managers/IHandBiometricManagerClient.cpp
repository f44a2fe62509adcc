// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "IHandBiometricManagerClient"

#include "pemaro/IHandBiometricManagerClient.h"

#include "managers/ManagerCall.h"
#include "pemaro/BnHandBiometricManagerClient.h"
#include "pemaro/BpHandBiometricManagerClient.h"

namespace pemaro {

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;

namespace {

constexpr uint32_t INJECT_HANDBIOMETRIC = IBinder::FIRST_CALL_TRANSACTION;

constexpr ProxyRow kHandBiometricCallback = managerRow(
        INJECT_HANDBIOMETRIC, "Bp::handBiometricCallback", "handBiometricCallback() error: %s");

}  // namespace

BpHandBiometricManagerClient::BpHandBiometricManagerClient(const sp<IBinder>& remote)
        : BpInterface<IHandBiometricManagerClient>(remote) {}

int BpHandBiometricManagerClient::handBiometricCallback(HandBioData* data) {
    return ManagerCall(LOG_TAG, kHandBiometricCallback, descriptor)
            .transactWithRecord(remote(), data);
}

IMPLEMENT_META_INTERFACE(HandBiometricManagerClient, "pemaro.HandBiometricManagerClient")

namespace {

using Client = IHandBiometricManagerClient;

const StubRow<Client> kRows[] = {
        {"INJECT_HANDBIOMETRIC transact received...",
         replyRecord<&Client::handBiometricCallback, Client::HandBioData>},
};

}  // namespace

status_t BnHandBiometricManagerClient::onTransact(uint32_t code, const Parcel& data, Parcel* reply,
                                                  uint32_t flags) {
    Client& client = *this;
    return dispatch(LOG_TAG, kRows, *this, client, code, data, reply,
                    [&] { return BBinder::onTransact(code, data, reply, flags); });
}

}  // namespace pemaro
