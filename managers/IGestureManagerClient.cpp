// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "IGestureManagerClient"

#include "pemaro/IGestureManagerClient.h"

#include "managers/ManagerCallback.h"
#include "pemaro/BnGestureManagerClient.h"
#include "pemaro/BpGestureManagerClient.h"

namespace pemaro {

namespace {

constexpr CallbackTexts kTexts = {"Bp::gestureCallback", "gestureCallback() error: %s",
                                  "INJECT_GESTURE transact received..."};

}  // namespace

IMPLEMENT_MANAGER_CALLBACK(GestureManagerClient, "pemaro.GestureManagerClient", gestureCallback,
                           GestureData, kTexts)

}  // namespace pemaro
