// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>

namespace pemaro::simulator {

/// The services of a touch stack.
enum class ServiceKind { kCompanion, kTouch, kGesture, kHand };

constexpr ServiceKind kServiceKinds[] = {ServiceKind::kCompanion, ServiceKind::kTouch,
                                         ServiceKind::kGesture, ServiceKind::kHand};

/// What a command line calls it: "companion", "touch", "gesture", "hand".
const char* shortName(ServiceKind service);

/// What it is registered as with the service manager.
const char* registeredName(ServiceKind service);

/// The service with this short name, if any.
std::optional<ServiceKind> serviceKindOf(const std::string& shortName);

}  // namespace pemaro::simulator
