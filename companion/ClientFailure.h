// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "binder/ServiceCall.h"

namespace pemaro {

/// How TouchCompanionClient's operations log a failed call: with a text alone, and not at all
/// without a service.
constexpr CallFailure clientFailure(const char* text) {
    return {"TouchCompanionClient", text, WithoutService::Quiet};
}

constexpr CallFailure kUnloggedFailure = clientFailure(nullptr);

}  // namespace pemaro
