// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <memory>

#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/ManagerFactories.h"
#include "pemaro/TouchManagerClient.h"
#include "tools/zelkctl/services/EventReceiver.h"
#include "tools/zelkctl/services/ServiceWatch.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/StopSignal.h"

namespace pemaro::zelkctl {

// The three managers, each as a type that tells its name and makes its client, with the exported
// factory, as a program outside the tree does.
// Events go to `receiver`; without one they are dropped.

struct TouchManager {
    using Client = TouchManagerClient;
    static constexpr const char* kService = "pemaro.TouchManagerService";
    static android::sp<Client> create(EventReceiver* receiver);
};

struct GestureManager {
    using Client = GestureManagerClient;
    static constexpr const char* kService = "pemaro.GestureManagerService";
    static android::sp<Client> create(EventReceiver* receiver);
};

struct HandManager {
    using Client = HandBiometricManagerClient;
    static constexpr const char* kService = "pemaro.HandBiometricManagerService";
    static android::sp<Client> create(EventReceiver* receiver);
};

/// Runs `body` with a connected client of a manager and returns the exit status, which is that of
/// `body` when the connection was made.
template <typename Manager, typename Body>
int withManager(Body body) {
    if (!startBinder()) {
        return tools::kExitFailure;
    }
    const StopSignal stopSignal;
    const auto service = ServiceWatch::await(Manager::kService, ServiceWatch::kPatience,
                                             [&] { return stopSignal.caught(); });
    if (service == nullptr) {
        return failAbsent(Manager::kService);
    }
    const android::sp<typename Manager::Client> client = Manager::create(nullptr);
    const int status = client->init();
    if (status != STATUS_NO_ERROR) {
        return failStatus("init", status);
    }
    const int result = body(*client);
    client->deinit();
    return result;
}

/// The same for one operation and what it prints when it succeeded.
template <typename Manager, typename Operation>
int operate(const char* name, Operation operation, const std::string& done) {
    return withManager<Manager>([&](typename Manager::Client& client) {
        const int status = operation(client);
        if (status != STATUS_NO_ERROR) {
            return failStatus(name, status);
        }
        fmt::print("{}\n", done);
        return tools::kExitSuccess;
    });
}

}  // namespace pemaro::zelkctl
