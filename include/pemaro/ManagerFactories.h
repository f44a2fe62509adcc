// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"
#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/TouchManagerClient.h"

// The factories of the manager clients, with C linkage, for callers that find them by name.
//
//     using Create = decltype(&VEXPemaroGestureManagerClientCreateInstance);
//     auto create = reinterpret_cast<Create>(
//             dlsym(library, "VEXPemaroGestureManagerClientCreateInstance"));
//     pemaro::GestureManagerClient* made = nullptr;
//     create(&made, onGesture, onDeath, context);
//     android::sp<pemaro::GestureManagerClient> client = made;
//
// Each makes a client with the constructor that takes callbacks and a context, stores its address
// in `*out`, which must not be null, and returns 0. No reference is taken: the caller adopts the
// object into a strong pointer before it calls init(), and the object lives as long as strong
// pointers to it exist. The clients' operations are no virtual functions: who does not link the
// library finds each by its symbol, and calls it with the object in front (docs/manual.md).

extern "C" {

ZELK_API int VEXPemaroTouchManagerClientCreateInstance(
        pemaro::TouchManagerClient** out, pemaro::TouchManagerClient::GestureCallback callback,
        void* ctx);

ZELK_API int VEXPemaroGestureManagerClientCreateInstance(
        pemaro::GestureManagerClient** out, pemaro::GestureManagerClient::GestureCallback gestureCb,
        pemaro::GestureManagerClient::DeathCallback deathCb, void* ctx);

ZELK_API int VEXPemaroHandBiometricManagerClientCreateInstance(
        pemaro::HandBiometricManagerClient** out,
        pemaro::HandBiometricManagerClient::EventCallback eventCb,
        pemaro::HandBiometricManagerClient::DeathCallback deathCb, void* ctx);

}  // extern "C"
