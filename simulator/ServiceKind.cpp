// SPDX-License-Identifier: Apache-2.0
#include "simulator/ServiceKind.h"

namespace pemaro::simulator {
namespace {

struct Names {
    const char* shortName;
    const char* registeredName;
};

Names namesOf(ServiceKind service) {
    switch (service) {
        case ServiceKind::kTouch:
            return {"touch", "pemaro.TouchManagerService"};
        case ServiceKind::kGesture:
            return {"gesture", "pemaro.GestureManagerService"};
        case ServiceKind::kHand:
            return {"hand", "pemaro.HandBiometricManagerService"};
        case ServiceKind::kCompanion:
            break;
    }
    return {"companion", "pemaro.TouchService"};
}

}  // namespace

const char* shortName(ServiceKind service) {
    return namesOf(service).shortName;
}

const char* registeredName(ServiceKind service) {
    return namesOf(service).registeredName;
}

std::optional<ServiceKind> serviceKindOf(const std::string& shortName) {
    for (const ServiceKind service : kServiceKinds) {
        if (shortName == namesOf(service).shortName) {
            return service;
        }
    }
    return std::nullopt;
}

}  // namespace pemaro::simulator
