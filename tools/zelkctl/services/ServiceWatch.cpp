// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/ServiceWatch.h"

#include <binder/IServiceManager.h>
#include <binder/ProcessState.h>

#include <atomic>
#include <thread>

#include "tools/common/BinderDriver.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Supervisor.h"

using android::IBinder;
using android::sp;
using Clock = std::chrono::steady_clock;

namespace pemaro::zelkctl {
namespace {

constexpr std::chrono::milliseconds kLookupPeriod(50);
constexpr std::chrono::milliseconds kQuietFor(1500);

}  // namespace

class ServiceWatch::DeathNotice : public IBinder::DeathRecipient {
  public:
    void binderDied(const android::wp<IBinder>& /* who */) override { mDied = true; }
    bool died() const { return mDied; }

  private:
    std::atomic<bool> mDied{false};
};

std::unique_ptr<ServiceWatch> ServiceWatch::await(const char* name,
                                                  std::optional<std::chrono::seconds> patience,
                                                  const std::function<bool()>& giveUp) {
    const Clock::time_point start = Clock::now();
    bool told = false;
    std::unique_ptr<ServiceWatch> watch = find(name);
    while (watch == nullptr && !mustStop() && !(giveUp && giveUp())) {
        const Clock::duration waited = Clock::now() - start;
        if (patience && waited >= *patience) {
            break;
        }
        if (waited >= kQuietFor && !told) {
            note(fmt::format("waiting for the service {}", name));
            told = true;
        }
        std::this_thread::sleep_for(kLookupPeriod);
        watch = find(name);
    }
    return watch;
}

/// Null as well for one that died a moment ago, which the service manager may still know.
std::unique_ptr<ServiceWatch> ServiceWatch::find(const char* name) {
    const Calling calling("the service manager's checkService");
    const sp<IBinder> service =
            android::defaultServiceManager()->checkService(android::String16(name));
    const sp<DeathNotice> notice = new DeathNotice();
    if (service == nullptr || service->linkToDeath(notice) != android::OK) {
        return nullptr;
    }
    return std::unique_ptr<ServiceWatch>(new ServiceWatch(service, notice));
}

ServiceWatch::ServiceWatch(const sp<IBinder>& service, const sp<DeathNotice>& notice)
        : mService(service), mNotice(notice) {}

ServiceWatch::~ServiceWatch() {
    mService->unlinkToDeath(mNotice);
}

bool ServiceWatch::died() const {
    return mNotice->died();
}

int failMissing(const char* name) {
    return mustStop() ? failStopped() : failAbsent(name);
}

int startBinder() {
    const std::string problem =
            call("the service manager's ping", [] { return tools::binderProblem(); });
    if (!problem.empty()) {
        return fail(problem, tools::kExitAbsent);
    }
    // Events and death notices arrive on Binder threads.
    android::ProcessState::self()->startThreadPool();
    return tools::kExitSuccess;
}

}  // namespace pemaro::zelkctl
