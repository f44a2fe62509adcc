// SPDX-License-Identifier: Apache-2.0
#include <fmt/core.h>

#include <algorithm>
#include <climits>

#include "tools/zelkctl/conformance/Conformance.h"

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;

namespace pemaro::zelkctl {
namespace {

constexpr const char* kOtherToken = "pemaro.conformance.Other";
/// Far beyond the codes of any interface.
constexpr uint32_t kFarCode = 0x00FFFF00;
constexpr uint32_t kReadBinaryConfiguration = 22;
constexpr uint32_t kReadConfiguration = 24;
constexpr uint32_t kWriteBinaryConfiguration = 21;

/// Whether a request without the token was refused, which leaves its code unseen.
std::string acceptance(const Subject& subject, uint32_t code, const char* token) {
    Parcel request;
    Parcel reply;
    if (token != nullptr) {
        subject.begin(request, token);
    }
    const status_t result = subject.transact(code, request, &reply);
    if (result == android::PERMISSION_DENIED) {
        return "";
    }
    return fmt::format("code {} {} a token ended with {} instead of {}", code,
                       token == nullptr ? "without" : "with another interface's as", result,
                       static_cast<int>(android::PERMISSION_DENIED));
}

/// Codes that a service which looks at them first may act on, as far as that does no harm.
std::vector<uint32_t> codesToTry(const Subject& subject) {
    std::vector<uint32_t> codes = {subject.interface().lastCode + 1, kFarCode};
    for (const CheckedCall& call : subject.interface().calls) {
        if (call.harm == Harm::kNone || subject.isInvasive()) {
            codes.push_back(call.code);
        }
    }
    return codes;
}

void checkTokens(const Subject& subject) {
    for (const char* token : {static_cast<const char*>(nullptr), kOtherToken}) {
        std::string problem;
        for (const uint32_t code : codesToTry(subject)) {
            if (problem.empty()) {
                problem = acceptance(subject, code, token);
            }
        }
        subject.tell(token == nullptr
                             ? "refuses a request without a token before it looks at its code"
                             : "refuses another interface's token before it looks at the code",
                     problem);
    }
}

void checkUnknownCodes(const Subject& subject) {
    std::string problem;
    for (const uint32_t code : {subject.interface().lastCode + 1, kFarCode}) {
        Parcel reply;
        const status_t result = subject.call(code, noArguments, &reply);
        if (result != android::UNKNOWN_TRANSACTION && problem.empty()) {
            problem = fmt::format("code {} ended with {} instead of {}", code, result,
                                  static_cast<int>(android::UNKNOWN_TRANSACTION));
        }
    }
    subject.tell("does not know codes that there are not", problem);
}

void checkDescriptor(const Subject& subject) {
    Parcel reply;
    const status_t result = subject.call(IBinder::INTERFACE_TRANSACTION, noArguments, &reply);
    const std::string told(android::String8(reply.readString16()).c_str());
    subject.tell("tells its descriptor",
                 result == android::OK && told == subject.interface().descriptor
                         ? ""
                         : fmt::format("result {}, '{}'", result, told));
}

std::string callProblem(const Subject& subject, const CheckedCall& call, bool withArguments) {
    Parcel reply;
    const status_t result =
            subject.call(call.code, withArguments ? call.arguments : noArguments, &reply);
    return result == android::OK ? replyProblem(reply, call.layout)
                                 : fmt::format("the transaction ended with {}", result);
}

void checkReplies(const Subject& subject) {
    for (const CheckedCall& call : subject.interface().calls) {
        const std::string check = fmt::format("the reply of {} is as it should be", call.name);
        if (call.harm == Harm::kNone || subject.isInvasive()) {
            subject.tell(check, callProblem(subject, call, true));
        } else {
            subject.skip(check, "it may change something; see --invasive");
        }
    }
}

/// A request that ends early is read as zeros and empty texts.
void checkShortRequests(const Subject& subject) {
    std::string problem;
    for (const CheckedCall& call : subject.interface().calls) {
        // Without its size the length of all that there is has no bytes behind it.
        const bool isBinary = call.code == kReadBinaryConfiguration;
        if (call.harm == Harm::kNone && !isBinary && problem.empty()) {
            const std::string found = callProblem(subject, call, false);
            problem = found.empty() ? "" : fmt::format("{}: {}", call.name, found);
        }
    }
    subject.tell("reads a request that ends early as zeros", problem);
}

/// A service that could not make room, or was not sent enough, replies nothing.
std::string refusal(const Subject& subject, uint32_t code, int32_t length) {
    Parcel reply;
    const status_t result = subject.call(
            code, [length](Parcel& request) { request.writeInt32(length); }, &reply);
    return result != android::OK || reply.dataSize() == 0
                   ? ""
                   : fmt::format("a length of {} was answered with {} bytes", length,
                                 reply.dataSize());
}

void checkLengths(const Subject& subject) {
    if (subject.interface().service != CheckedService::kCompanion) {
        return;
    }
    std::string problem;
    for (const int32_t length : {-1, INT32_MIN}) {
        if (problem.empty()) {
            problem = refusal(subject, kReadBinaryConfiguration, length);
        }
    }
    subject.tell("refuses to fill a buffer of negative length", problem);

    problem.clear();
    for (const int32_t length : {-1, INT32_MIN, INT32_MAX}) {
        Parcel reply;
        const status_t result = subject.call(
                kReadConfiguration, [length](Parcel& request) { request.writeInt32(length); },
                &reply);
        if (problem.empty()) {
            problem = result == android::OK ? replyProblem(reply, "Sm")
                                            : fmt::format("the transaction ended with {}", result);
        }
    }
    subject.tell("takes a text of an impossible length for an empty one", problem);

    const char* check = "refuses a configuration that is shorter than it tells";
    if (!subject.isInvasive()) {
        subject.skip(check, "it may change something; see --invasive");
        return;
    }
    problem.clear();
    for (const int32_t length : {-1, INT32_MIN, 1 << 20}) {
        if (problem.empty()) {
            problem = refusal(subject, kWriteBinaryConfiguration, length);
        }
    }
    subject.tell(check, problem);
}

class DeathNotice : public IBinder::DeathRecipient {
  public:
    void binderDied(const android::wp<IBinder>&) override {}
};

void checkDeathLinks(const Subject& subject) {
    const sp<DeathNotice> notice = new DeathNotice();
    const status_t unlinked = subject.ask("death link", [&] {
        const status_t linked = subject.binder()->linkToDeath(notice);
        return linked == android::OK ? subject.binder()->unlinkToDeath(notice) : linked;
    });
    subject.tell("lets its death be watched",
                 unlinked == android::OK ? "" : fmt::format("the link ended with {}", unlinked));
}

}  // namespace

void checkWire(const Subject& subject) {
    const status_t ping = subject.ask("ping", [&] { return subject.binder()->pingBinder(); });
    subject.tell("answers a ping", ping == android::OK ? "" : fmt::format("result {}", ping));
    checkDescriptor(subject);
    checkTokens(subject);
    checkUnknownCodes(subject);
    checkReplies(subject);
    checkShortRequests(subject);
    checkLengths(subject);
    checkDeathLinks(subject);
}

}  // namespace pemaro::zelkctl
