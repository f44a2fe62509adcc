// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/Managers.h"

using android::sp;

namespace pemaro::zelkctl {
namespace {

template <typename Record>
void (*callbackFor(EventReceiver* receiver))(Record*, void*) {
    return receiver == nullptr ? nullptr : &EventReceiver::onEvent<Record>;
}

}  // namespace

sp<TouchManagerClient> TouchManager::create(EventReceiver* receiver) {
    TouchManagerClient* client = nullptr;
    VEXPemaroTouchManagerClientCreateInstance(
            &client, callbackFor<ITouchManagerClient::GestureData>(receiver), receiver);
    return client;
}

sp<GestureManagerClient> GestureManager::create(EventReceiver* receiver) {
    GestureManagerClient* client = nullptr;
    VEXPemaroGestureManagerClientCreateInstance(
            &client, callbackFor<IGestureManagerClient::GestureData>(receiver), nullptr, receiver);
    return client;
}

sp<HandBiometricManagerClient> HandManager::create(EventReceiver* receiver) {
    HandBiometricManagerClient* client = nullptr;
    VEXPemaroHandBiometricManagerClientCreateInstance(
            &client, callbackFor<IHandBiometricManagerClient::HandBioData>(receiver), nullptr,
            receiver);
    return client;
}

}  // namespace pemaro::zelkctl
