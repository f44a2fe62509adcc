// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "IHandBiometricManagerClient"

#include "pemaro/IHandBiometricManagerClient.h"

#include "managers/ManagerCallback.h"
#include "pemaro/BnHandBiometricManagerClient.h"
#include "pemaro/BpHandBiometricManagerClient.h"

namespace pemaro {

namespace {

constexpr CallbackTexts kTexts = {"Bp::handBiometricCallback", "handBiometricCallback() error: %s",
                                  "INJECT_HANDBIOMETRIC transact received..."};

}  // namespace

IMPLEMENT_MANAGER_CALLBACK(HandBiometricManagerClient, "pemaro.HandBiometricManagerClient",
                           handBiometricCallback, HandBioData, kTexts)

}  // namespace pemaro
