// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/conformance/Conformance.h"

#include <fmt/core.h>

#include <chrono>
#include <cstring>
#include <future>
#include <memory>
#include <mutex>
#include <thread>
#include <utility>

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;

namespace pemaro::zelkctl {
namespace {

/// Longer than any of the groups of checks takes with a good service.
constexpr std::chrono::seconds kPatience(10);

/// Passes findings on until it is told that nobody wants them any more.
class Gate {
  public:
    explicit Gate(std::function<void(const Finding&)> report) : mReport(std::move(report)) {}

    void pass(const Finding& finding) {
        std::lock_guard<std::mutex> guard(mLock);
        if (mReport) {
            mReport(finding);
        }
    }

    void close() {
        std::lock_guard<std::mutex> guard(mLock);
        mReport = nullptr;
    }

  private:
    std::mutex mLock;
    std::function<void(const Finding&)> mReport;
};

/// Runs a group of checks on a thread of its own, which is left behind when it does not end.
bool runGroup(void (*group)(const Subject&), const std::shared_ptr<const Subject>& subject) {
    std::packaged_task<void()> task([group, subject] { group(*subject); });
    std::future<void> done = task.get_future();
    std::thread(std::move(task)).detach();
    return done.wait_for(kPatience) == std::future_status::ready;
}

}  // namespace

Parcel& Subject::begin(Parcel& request, const char* token) const {
    request.writeInterfaceToken(
            android::String16(token == nullptr ? mInterface.descriptor : token));
    return request;
}

status_t Subject::call(uint32_t code, const std::function<void(Parcel&)>& arguments,
                       Parcel* reply) const {
    Parcel request;
    arguments(begin(request));
    return mBinder->transact(code, request, reply);
}

int32_t Subject::callForStatus(uint32_t code, const std::function<void(Parcel&)>& arguments,
                               std::string* problem) const {
    Parcel reply;
    const status_t result = call(code, arguments, &reply);
    if (result != android::OK) {
        *problem = fmt::format("the transaction ended with {}", result);
        return -1;
    }
    int32_t status = -1;
    *problem = replyProblem(reply, "S", &status);
    return problem->empty() ? status : -1;
}

void Subject::tell(const std::string& check, const std::string& problem) const {
    mReport({mInterface.descriptor, check, problem.empty() ? Outcome::kPassed : Outcome::kFailed,
             problem});
}

void Subject::skip(const std::string& check, const std::string& reason) const {
    mReport({mInterface.descriptor, check, Outcome::kSkipped, reason});
}

void checkService(const sp<IBinder>& binder, const CheckedInterface& interface, bool invasive,
                  const std::function<void(const Finding&)>& report) {
    const auto gate = std::make_shared<Gate>(report);
    const auto subject = std::make_shared<const Subject>(
            binder, interface, invasive, [gate](const Finding& finding) { gate->pass(finding); });
    const bool isCompanion = interface.service == CheckedService::kCompanion;
    const bool answers = runGroup(checkWire, subject) &&
                         runGroup(isCompanion ? checkRecording : checkSubscription, subject);
    subject->tell("answers in time",
                  answers ? ""
                          : fmt::format("no answer for {} s; the other checks are left out",
                                        kPatience.count()));
    gate->close();
    if (answers) {
        report({interface.descriptor, "lives on after the checks",
                binder->pingBinder() == android::OK ? Outcome::kPassed : Outcome::kFailed,
                binder->isBinderAlive() ? "" : "it died"});
    }
}

}  // namespace pemaro::zelkctl
