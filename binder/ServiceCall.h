// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <log/log.h>

#include <functional>
#include <utility>

#include "binder/Guard.h"
#include "pemaro/Binder.h"
#include "pemaro/Status.h"

namespace pemaro {

/// Whether an operation that finds no service held logs its failure as others do.
enum class WithoutService { Logged, Quiet };

/// How a client tells in the log (error) that an operation failed.
struct CallFailure {
    const char* tag;
    /// A format whose %s, if it has one, is the status's message; null where nothing is logged.
    const char* text;
    WithoutService withoutService = WithoutService::Logged;
};

/// What every operation of a client does: calls `operation` (a member function of the service, or
/// anything that takes the service) and passes its status on; 0x4000000B when no service is held.
template <typename Service, typename Operation, typename... Arguments>
int callService(const CallFailure& failure, const android::sp<Service>& service,
                Operation&& operation, Arguments&&... arguments) {
    // Kept for the call, during which another thread or a callback may let go of the service.
    const android::sp<Service> held = copyGuarded(service);
    const int status = held == nullptr ? STATUS_INVALID_STATE
                                       : std::invoke(std::forward<Operation>(operation), *held,
                                                     std::forward<Arguments>(arguments)...);
    const bool logged = held != nullptr || failure.withoutService == WithoutService::Logged;
    if (status != STATUS_NO_ERROR && logged && failure.text != nullptr) {
        __android_log_print(ANDROID_LOG_ERROR, failure.tag, failure.text, errStr(status));
    }
    return status;
}

}  // namespace pemaro
