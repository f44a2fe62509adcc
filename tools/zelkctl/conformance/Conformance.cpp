// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/conformance/Conformance.h"

#include <fmt/core.h>

#include <chrono>
#include <cstring>
#include <future>
#include <memory>
#include <mutex>
#include <optional>
#include <thread>
#include <utility>

#include "tools/zelkctl/terminal/Supervisor.h"

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;

namespace pemaro::zelkctl {
namespace {

/// Longer than any of the groups of checks takes with a good service.
constexpr std::chrono::seconds kPatience(10);

/// Passes findings on, and has the answers waited for, until it is told that nobody wants them any
/// more.
class Gate {
  public:
    Gate(std::string service, std::function<void(const Finding&)> report)
            : mService(std::move(service)), mReport(std::move(report)) {}

    void pass(const Finding& finding) {
        std::lock_guard<std::mutex> guard(mLock);
        if (mReport) {
            mReport(finding);
        }
    }

    void ask(const std::string& question) {
        std::lock_guard<std::mutex> guard(mLock);
        mCalling.reset();
        if (mReport && !question.empty()) {
            mCalling.emplace(fmt::format("check of {}: {}", mService, question));
        }
    }

    void close() {
        std::lock_guard<std::mutex> guard(mLock);
        mReport = nullptr;
        mCalling.reset();
    }

  private:
    const std::string mService;
    std::mutex mLock;
    std::function<void(const Finding&)> mReport;
    std::optional<Calling> mCalling;
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
    return transact(code, request, reply);
}

status_t Subject::transact(uint32_t code, const Parcel& request, Parcel* reply) const {
    return ask(fmt::format("code {}", code),
               [&] { return mBinder->transact(code, request, reply); });
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
    const auto gate = std::make_shared<Gate>(interface.word, report);
    const auto subject = std::make_shared<const Subject>(
            binder, interface, invasive, [gate](const Finding& finding) { gate->pass(finding); },
            [gate](const std::string& question) { gate->ask(question); });
    const bool isCompanion = interface.service == CheckedService::kCompanion;
    const bool answers = runGroup(checkWire, subject) &&
                         runGroup(isCompanion ? checkRecording : checkSubscription, subject);
    subject->tell("answers in time",
                  answers ? ""
                          : fmt::format("no answer for {} s; the other checks are left out",
                                        kPatience.count()));
    if (answers) {
        const status_t ping = subject->ask("ping", [&] { return binder->pingBinder(); });
        report({interface.descriptor, "lives on after the checks",
                ping == android::OK ? Outcome::kPassed : Outcome::kFailed,
                binder->isBinderAlive() ? "" : "it died"});
    }
    gate->close();
}

}  // namespace pemaro::zelkctl
