// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <binder/Parcel.h>

#include <functional>
#include <string>

#include "tools/zelkctl/conformance/Findings.h"
#include "tools/zelkctl/conformance/Operations.h"

namespace pemaro::zelkctl {

/// A service that is being checked: calls to it as a client makes them, and what is found.
class Subject {
  public:
    /// `told` hears of each question before it is asked, and of none when the answer is there.
    Subject(const android::sp<android::IBinder>& binder, const CheckedInterface& interface,
            bool invasive, const std::function<void(const Finding&)>& report,
            const std::function<void(const std::string& question)>& told)
            : mBinder(binder),
              mInterface(interface),
              mInvasive(invasive),
              mReport(report),
              mTold(told) {}

    const android::sp<android::IBinder>& binder() const { return mBinder; }
    const CheckedInterface& interface() const { return mInterface; }
    bool isInvasive() const { return mInvasive; }

    /// Whatever waits for the service goes through here, one question after another; what `answer`
    /// returns.
    template <typename Answer>
    auto ask(const std::string& question, Answer answer) const {
        mTold(question);
        const auto result = answer();
        mTold("");
        return result;
    }

    /// Sends a request as it is; the transaction's result.
    android::status_t transact(uint32_t code, const android::Parcel& request,
                               android::Parcel* reply) const;

    /// A request that begins with the interface token of this service, or another one.
    android::Parcel& begin(android::Parcel& request) const { return begin(request, nullptr); }
    android::Parcel& begin(android::Parcel& request, const char* token) const;

    /// Sends token and arguments; the transaction's result.
    android::status_t call(uint32_t code, const std::function<void(android::Parcel&)>& arguments,
                           android::Parcel* reply) const;

    /// The same for a call whose reply is a status alone: the status, or -1 with the reason in `problem`.
    int32_t callForStatus(uint32_t code, const std::function<void(android::Parcel&)>& arguments,
                          std::string* problem) const;

    /// Passed where `problem` is empty, else failed.
    void tell(const std::string& check, const std::string& problem) const;
    void skip(const std::string& check, const std::string& reason) const;

  private:
    const android::sp<android::IBinder> mBinder;
    const CheckedInterface& mInterface;
    const bool mInvasive;
    const std::function<void(const Finding&)> mReport;
    const std::function<void(const std::string&)> mTold;
};

// What is checked.

/// Tokens, codes, replies, lengths, death links.
void checkWire(const Subject& subject);
/// A recording to shared memory, from its preparation to its end.
void checkRecording(const Subject& subject);
/// A subscription to a manager's events, from its beginning to its end.
void checkSubscription(const Subject& subject);

/// All of that for one service. It is given up, as failed, when no answer comes for long.
void checkService(const android::sp<android::IBinder>& binder, const CheckedInterface& interface,
                  bool invasive, const std::function<void(const Finding&)>& report);

}  // namespace pemaro::zelkctl
