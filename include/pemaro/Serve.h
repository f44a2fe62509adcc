// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <binder/IPCThreadState.h>
#include <binder/IServiceManager.h>
#include <binder/ProcessState.h>

namespace pemaro {

/// Registers a service with the service manager under its interface's name, by which the clients
/// look it up, and then starts the threads on which Binder calls its operations. 0, or what the
/// service manager answers: -1 to a process that may not. Waits for the service manager to be there.
/// REQUIRES: the service derives from one of the stubs.
///
///     return publish(new GestureService) == android::OK ? workUntilTheEnd() : EXIT_FAILURE;
inline android::status_t publish(const android::sp<android::IBinder>& service) {
    const android::status_t status = android::defaultServiceManager()->addService(
            service->getInterfaceDescriptor(), service);
    if (status == android::OK) {
        android::ProcessState::self()->startThreadPool();
    }
    return status;
}

/// The same for a process that has nothing else to do: the calling thread becomes one of Binder's,
/// and returns only when the service could not be registered, with the reason.
inline android::status_t serve(const android::sp<android::IBinder>& service) {
    const android::status_t status = publish(service);
    if (status == android::OK) {
        android::IPCThreadState::self()->joinThreadPool();
    }
    return status;
}

}  // namespace pemaro
