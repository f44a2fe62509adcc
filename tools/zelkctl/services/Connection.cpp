// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/Connection.h"

#include <utility>

#include "pemaro/Status.h"
#include "pemaro/TouchCompanionFactory.h"
#include "tools/zelkctl/terminal/Report.h"

using android::sp;

namespace pemaro::zelkctl {
namespace {

constexpr const char* kServiceName = "pemaro.TouchService";
constexpr int kFacadeClass = 2048;
constexpr int kFacadeVersion = kFacadeClass << 16;

}  // namespace

std::unique_ptr<Connection> Connection::open() {
    if (!startBinder()) {
        return nullptr;
    }
    auto service = ServiceWatch::await(kServiceName, std::chrono::seconds(0), [] { return false; });
    if (service == nullptr) {
        failAbsent(kServiceName);
        return nullptr;
    }
    return std::unique_ptr<Connection>(new Connection(std::move(service)));
}

Connection::Connection(std::unique_ptr<ServiceWatch> service) : mService(std::move(service)) {}

std::unique_ptr<ITouchCompanionFacade> Connection::openFacade(
        TouchCompanionClient::DataCallback callback, void* context) {
    void* instance = nullptr;
    int status = VEXPemaroCreateInstance(kFacadeClass, kFacadeVersion, &instance);
    if (status != STATUS_NO_ERROR) {
        failStatus("create", status);
        return nullptr;
    }
    std::unique_ptr<ITouchCompanionFacade> facade(static_cast<ITouchCompanionFacade*>(instance));
    status = facade->init(callback, context);
    if (status != STATUS_NO_ERROR) {
        failStatus("init", status);
        return nullptr;
    }
    return facade;
}

sp<TouchCompanionClient> Connection::openClient() {
    const sp<TouchCompanionClient> client = new TouchCompanionClient();
    const int status = client->init();
    if (status != STATUS_NO_ERROR) {
        failStatus("init", status);
        return nullptr;
    }
    return client;
}

}  // namespace pemaro::zelkctl
