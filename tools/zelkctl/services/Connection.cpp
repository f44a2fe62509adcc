// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/Connection.h"

#include <utility>

#include "pemaro/Status.h"
#include "pemaro/TouchCompanionFactory.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Supervisor.h"

using android::sp;

namespace pemaro::zelkctl {
namespace {

constexpr int kFacadeClass = 2048;
constexpr int kFacadeVersion = kFacadeClass << 16;

}  // namespace

std::unique_ptr<Connection> Connection::open(int& exitStatus) {
    exitStatus = startBinder();
    if (exitStatus != tools::kExitSuccess) {
        return nullptr;
    }
    auto service = ServiceWatch::await(kService, std::chrono::seconds(0));
    if (service == nullptr) {
        exitStatus = failMissing(kService);
        return nullptr;
    }
    return std::unique_ptr<Connection>(new Connection(std::move(service)));
}

Connection::Connection(std::unique_ptr<ServiceWatch> service) : mService(std::move(service)) {}

sp<ITouchCompanionService> Connection::service() const {
    return android::interface_cast<ITouchCompanionService>(mService->binder());
}

std::unique_ptr<ITouchCompanionFacade> Connection::openFacade(
        int& exitStatus, TouchCompanionClient::DataCallback callback, void* context) {
    void* instance = nullptr;
    int status = VEXPemaroCreateInstance(kFacadeClass, kFacadeVersion, &instance);
    if (status != STATUS_NO_ERROR) {
        exitStatus = failStatus("create", status);
        return nullptr;
    }
    std::unique_ptr<ITouchCompanionFacade> facade(static_cast<ITouchCompanionFacade*>(instance));
    status = call("init", [&] { return facade->init(callback, context); });
    if (status != STATUS_NO_ERROR) {
        exitStatus = failStatus("init", status);
        return nullptr;
    }
    return facade;
}

sp<TouchCompanionClient> Connection::openClient(int& exitStatus) {
    const sp<TouchCompanionClient> client = new TouchCompanionClient();
    const int status = call("init", [&] { return client->init(); });
    if (status != STATUS_NO_ERROR) {
        exitStatus = failStatus("init", status);
        return nullptr;
    }
    return client;
}

}  // namespace pemaro::zelkctl
