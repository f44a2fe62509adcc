// SPDX-License-Identifier: Apache-2.0
#include "pemaro/ManagerFactories.h"

#include "pemaro/Status.h"

using pemaro::GestureManagerClient;
using pemaro::HandBiometricManagerClient;
using pemaro::TouchManagerClient;

int VEXPemaroTouchManagerClientCreateInstance(TouchManagerClient** out,
                                              TouchManagerClient::GestureCallback callback,
                                              void* ctx) {
    *out = new TouchManagerClient(callback, ctx);
    return pemaro::STATUS_NO_ERROR;
}

int VEXPemaroGestureManagerClientCreateInstance(GestureManagerClient** out,
                                                GestureManagerClient::GestureCallback gestureCb,
                                                GestureManagerClient::DeathCallback deathCb,
                                                void* ctx) {
    *out = new GestureManagerClient(gestureCb, deathCb, ctx);
    return pemaro::STATUS_NO_ERROR;
}

int VEXPemaroHandBiometricManagerClientCreateInstance(
        HandBiometricManagerClient** out, HandBiometricManagerClient::EventCallback eventCb,
        HandBiometricManagerClient::DeathCallback deathCb, void* ctx) {
    *out = new HandBiometricManagerClient(eventCb, deathCb, ctx);
    return pemaro::STATUS_NO_ERROR;
}
