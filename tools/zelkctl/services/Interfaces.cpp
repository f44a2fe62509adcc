// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/Interfaces.h"

#include "pemaro/Binder.h"

#include <binder/IBinder.h>
#include <fmt/core.h>

#include <algorithm>

#include "pemaro/IGestureManagerClient.h"
#include "pemaro/IHandBiometricManagerClient.h"
#include "pemaro/ITouchManagerClient.h"

using android::IBinder;

namespace pemaro::zelkctl {
namespace {

// What the services are given and give back.

const KnownInterface kTouchClient = {"touch",
                                     "pemaro.TouchManagerClient",
                                     {{"gestureCallback"}},
                                     sizeof(ITouchManagerClient::GestureData)};
const KnownInterface kGestureClient = {"gesture",
                                       "pemaro.GestureManagerClient",
                                       {{"gestureCallback"}},
                                       sizeof(IGestureManagerClient::GestureData)};
const KnownInterface kHandClient = {"hand",
                                    "pemaro.HandBiometricManagerClient",
                                    {{"handBiometricCallback"}},
                                    sizeof(IHandBiometricManagerClient::HandBioData)};
const KnownInterface kCompanionClient = {"companion", "pemaro.TouchServiceClient", {}};
// The platform's own, for the control block.
const KnownInterface kHeap = {"companion", "android.utils.IMemoryHeap", {{"getHeapID"}}};
const KnownInterface kMemory = {
        "companion", "android.utils.IMemory", {{"getMemory", nullptr, &kHeap}}};

// The services.

const KnownInterface kCompanion = {"companion",
                                   "pemaro.TouchService",
                                   {
                                           {"registerClient", &kCompanionClient},
                                           {"unregisterClient"},
                                           {"open"},
                                           {"getCblk", nullptr, &kMemory},
                                           {"prepareRecord"},
                                           {"startRecord"},
                                           {"stopRecord"},
                                           {"setRecordFile"},
                                           {"sendEvent"},
                                           {"close"},
                                           {"reloadConfig (null path)"},
                                           {"reloadConfig (a path)"},
                                           {"setRecordParameter"},
                                           {"getProperties"},
                                           {"getAFEParams (map)"},
                                           {"setAFEParams"},
                                           {"getAFEParams (array)"},
                                           {"saveConfig (null path)"},
                                           {"saveConfig (a path)"},
                                           {"getPacketSize"},
                                           {"setConfigParams (binary)"},
                                           {"getConfigParams (binary)"},
                                           {"inspect"},
                                           {"getConfigParams (map)"},
                                           {"sendCommand"},
                                           {"saveSession"},
                                           {"restoreSession"},
                                           {"setAuth"},
                                   }};
const KnownInterface kTouch = {"touch",
                               "pemaro.TouchManagerService",
                               {
                                       {"subscribe", &kTouchClient},
                                       {"unsubscribe", &kTouchClient},
                                       {"isSupported"},
                                       {"isEnabled"},
                                       {"enable"},
                                       {"disable"},
                                       {"configure_vm_region"},
                               }};
const KnownInterface kGesture = {"gesture",
                                 "pemaro.GestureManagerService",
                                 {
                                         {"subscribe", &kGestureClient},
                                         {"unsubscribe", &kGestureClient},
                                         {"enableWakeup"},
                                         {"disableWakeup"},
                                         {"startGestureDetection"},
                                         {"stopGestureDetection"},
                                         {"addGesture"},
                                         {"deleteGesture"},
                                         {"enableGesture"},
                                         {"disableGesture"},
                                         {"improveGestureTraining"},
                                         {"getMaxPreDefinedGesture"},
                                         {"getMaxUserDefinedGesture"},
                                 }};
const KnownInterface kHand = {"hand",
                              "pemaro.HandBiometricManagerService",
                              {
                                      {"subscribe", &kHandClient},
                                      {"unsubscribe", &kHandClient},
                                      {"startEnrollment"},
                                      {"stopEnrollment"},
                                      {"scan"},
                                      {"startMatching"},
                                      {"stopMatching"},
                                      {"cancelScan"},
                                      {"setSecurity"},
                                      {"setProfileName"},
                                      {"deleteProfile"},
                                      {"renameProfile"},
                                      {"getMaxUser"},
                                      {"getProfileList"},
                                      {"enableWakeup"},
                                      {"disableWakeup"},
                              }};

/// What libbinder answers for every object.
struct CommonCode {
    uint32_t code;
    const char* name;
};

constexpr CommonCode kCommonCodes[] = {
        {IBinder::PING_TRANSACTION, "ping"},
        {IBinder::INTERFACE_TRANSACTION, "descriptor"},
        {IBinder::DUMP_TRANSACTION, "dump"},
        {IBinder::SHELL_COMMAND_TRANSACTION, "shell command"},
        {IBinder::SYSPROPS_TRANSACTION, "system properties"},
};

}  // namespace

const std::vector<const KnownInterface*>& knownServices() {
    static const std::vector<const KnownInterface*> services = {&kCompanion, &kTouch, &kGesture,
                                                                &kHand};
    return services;
}

const KnownInterface& knownService(const std::string& word) {
    return **std::find_if(
            knownServices().begin(), knownServices().end(),
            [&word](const KnownInterface* interface) { return interface->word == word; });
}

const std::vector<const KnownInterface*>& knownCallbacks() {
    static const std::vector<const KnownInterface*> callbacks = {&kTouchClient, &kGestureClient,
                                                                 &kHandClient};
    return callbacks;
}

std::string operationName(const KnownInterface& interface, uint32_t code) {
    const KnownOperation* operation = interface.find(code);
    if (operation != nullptr) {
        return operation->name;
    }
    for (const CommonCode& common : kCommonCodes) {
        if (common.code == code) {
            return common.name;
        }
    }
    return fmt::format("code {}", code);
}

}  // namespace pemaro::zelkctl
