// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "ITouchManagerClient"

#include "pemaro/ITouchManagerClient.h"

#include "managers/ManagerCallback.h"
#include "pemaro/BnTouchManagerClient.h"
#include "pemaro/BpTouchManagerClient.h"

namespace pemaro {

namespace {

constexpr CallbackTexts kTexts = {"Bp::gestureCallback", "gestureCallback() error: %s",
                                  "INJECT_GESTURE transact received..."};

}  // namespace

IMPLEMENT_MANAGER_CALLBACK(TouchManagerClient, "pemaro.TouchManagerClient", gestureCallback,
                           GestureData, kTexts)

}  // namespace pemaro
