// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/Connection.h"

#include <binder/IServiceManager.h>
#include <binder/ProcessState.h>

#include "pemaro/Status.h"
#include "pemaro/TouchCompanionFactory.h"
#include "tools/common/BinderDriver.h"
#include "tools/zelkctl/Report.h"

using android::IBinder;
using android::sp;
using android::String16;
using android::wp;

namespace pemaro::zelkctl {
namespace {

constexpr const char* kServiceName = "pemaro.TouchService";
constexpr int kFacadeClass = 2048;
constexpr int kFacadeVersion = kFacadeClass << 16;

}  // namespace

class Connection::DeathNotice : public IBinder::DeathRecipient {
  public:
    void binderDied(const wp<IBinder>& /* who */) override { mDied = true; }
    bool died() const { return mDied; }

  private:
    std::atomic<bool> mDied{false};
};

std::unique_ptr<Connection> Connection::open() {
    const std::string problem = tools::binderProblem();
    if (!problem.empty()) {
        fail(problem);
        return nullptr;
    }
    // Death notices arrive on a Binder thread.
    android::ProcessState::self()->startThreadPool();
    const sp<IBinder> service =
            android::defaultServiceManager()->checkService(String16(kServiceName));
    if (service == nullptr) {
        failAbsent(kServiceName);
        return nullptr;
    }
    const sp<DeathNotice> notice = new DeathNotice();
    if (service->linkToDeath(notice) != android::OK) {
        fail(fmt::format("the service {} is dead", kServiceName));
        return nullptr;
    }
    return std::unique_ptr<Connection>(new Connection(service, notice));
}

Connection::Connection(const sp<IBinder>& service, const sp<DeathNotice>& notice)
        : mService(service), mNotice(notice) {}

Connection::~Connection() {
    mService->unlinkToDeath(mNotice);
}

bool Connection::serviceDied() const {
    return mNotice->died();
}

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
