// SPDX-License-Identifier: Apache-2.0
#include <fmt/core.h>

#include <atomic>
#include <chrono>
#include <thread>

#include "pemaro/BnGestureManagerClient.h"
#include "pemaro/BnHandBiometricManagerClient.h"
#include "pemaro/BnTouchManagerClient.h"
#include "pemaro/Status.h"
#include "tools/zelkctl/conformance/Conformance.h"

using android::IBinder;
using android::Parcel;
using android::sp;

namespace pemaro::zelkctl {
namespace {

using std::chrono::milliseconds;

constexpr uint32_t kSubscribe = 1;
constexpr uint32_t kUnsubscribe = 2;

constexpr milliseconds kListenTime(400);
/// How long an event may be on its way when a subscription ends, and how long none may follow.
constexpr milliseconds kSettleTime(100);
constexpr milliseconds kSilence(400);

/// What arrived.
struct Events {
    std::atomic<int> whole{0};
    std::atomic<int> cutShort{0};

    int count(const void* record) {
        (record == nullptr ? cutShort : whole) += 1;
        return STATUS_NO_ERROR;
    }
};

template <typename Stub>
class GestureListener : public Stub {
  public:
    explicit GestureListener(Events& events) : mEvents(events) {}
    int gestureCallback(typename Stub::GestureData* data) override { return mEvents.count(data); }

  private:
    Events& mEvents;
};

class HandListener : public BnHandBiometricManagerClient {
  public:
    explicit HandListener(Events& events) : mEvents(events) {}
    int handBiometricCallback(HandBioData* data) override { return mEvents.count(data); }

  private:
    Events& mEvents;
};

sp<IBinder> makeListener(CheckedService service, Events& events) {
    switch (service) {
        case CheckedService::kTouch:
            return new GestureListener<BnTouchManagerClient>(events);
        case CheckedService::kGesture:
            return new GestureListener<BnGestureManagerClient>(events);
        default:
            return new HandListener(events);
    }
}

std::string statusProblem(int32_t status, const std::string& problem) {
    return problem.empty() && status != STATUS_NO_ERROR
                   ? fmt::format("the service said: {}", errStr(status))
                   : problem;
}

}  // namespace

void checkSubscription(const Subject& subject) {
    // They live as long as the process: an event may still be on its way.
    auto* events = new Events();
    const sp<IBinder> listener = makeListener(subject.interface().service, *events);
    const auto withListener = [&listener](Parcel& request) { request.writeStrongBinder(listener); };
    std::string problem;
    int32_t status = subject.callForStatus(kSubscribe, withListener, &problem);
    problem = statusProblem(status, problem);
    subject.tell("takes a subscription", problem);
    if (!problem.empty()) {
        return;
    }
    std::this_thread::sleep_for(kListenTime);
    const int seen = events->whole + events->cutShort;
    status = subject.callForStatus(kUnsubscribe, withListener, &problem);
    subject.tell("lets a subscription end", statusProblem(status, problem));

    std::this_thread::sleep_for(kSettleTime);
    const int before = events->whole + events->cutShort;
    std::this_thread::sleep_for(kSilence);
    const int after = events->whole + events->cutShort;
    subject.tell("reports nothing after that",
                 after == before ? "" : fmt::format("{} events came", after - before));
    const char* check = "reports events with a whole record";
    if (seen == 0) {
        subject.skip(check, "no event came");
    } else {
        subject.tell(check, events->cutShort == 0 ? ""
                                                  : fmt::format("{} of {} were cut short",
                                                                events->cutShort.load(), seen));
    }
}

}  // namespace pemaro::zelkctl
