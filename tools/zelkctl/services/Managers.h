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
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Supervisor.h"

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
    const int exitStatus = startBinder();
    if (exitStatus != tools::kExitSuccess) {
        return exitStatus;
    }
    const auto service = ServiceWatch::await(Manager::kService, ServiceWatch::kPatience);
    if (service == nullptr) {
        return failMissing(Manager::kService);
    }
    const android::sp<typename Manager::Client> client = Manager::create(nullptr);
    const int status = call("init", [&] { return client->init(); });
    if (status != STATUS_NO_ERROR) {
        return failStatus("init", status);
    }
    const int result = body(*client);
    const Calling calling("deinit");
    client->deinit();
    return result;
}

/// The same for one operation and what it prints when it succeeded; `about` is told with its
/// failure.
template <typename Manager, typename Operation>
int operate(const char* name, Operation operation, const std::string& done, JsonObject& object,
            const std::string& about = "") {
    return withManager<Manager>([&](typename Manager::Client& client) {
        const int status = call(name, [&] { return operation(client); });
        if (status != STATUS_NO_ERROR) {
            return failStatus(name, status, about);
        }
        sayResult(done, object);
        return tools::kExitSuccess;
    });
}

}  // namespace pemaro::zelkctl
