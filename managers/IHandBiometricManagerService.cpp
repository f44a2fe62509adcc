// SPDX-License-Identifier: Apache-2.0
// The hand biometric manager's transactions, both sides: first the codes and the texts of each
// operation, then the proxy, the meta-interface and the stub. docs/manager-protocol.md lists the
// parcels.

#define LOG_TAG "IHandBiometricManagerService"

#include "pemaro/IHandBiometricManagerService.h"

#include <log/log.h>

#include <initializer_list>

#include "managers/ManagerCall.h"
#include "pemaro/BnHandBiometricManagerService.h"
#include "pemaro/BpHandBiometricManagerService.h"
#include "pemaro/Status.h"

namespace pemaro {

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;

namespace {

enum {
    SUBSCRIBE = IBinder::FIRST_CALL_TRANSACTION,
    UNSUBSCRIBE,
    START_ENROLLMENT,
    STOP_ENROLLMENT,
    SCAN,
    START_MATCHING,
    STOP_MATCHING,
    CANCEL_SCAN,
    SET_SECURITY,
    SET_PROFILENAME,
    DELETE_PROFILE,
    RENAME_PROFILE,
    GET_MAXUSER,
    GET_PROFILELIST,
    ENABLE_WAKEUP,
    DISABLE_WAKEUP,
    END_OF_CODES,  // stays the last
};

// Log readers know these texts so; they stay: only the subscriptions fail with parentheses, and the
// wake-up operations fail as "enable()" and "disable()".
constexpr ProxyRow kStartEnrollment = {START_ENROLLMENT, "Bp::startEnrollment",
                                       "startEnrollment error: %s"};
constexpr ProxyRow kStopEnrollment = {STOP_ENROLLMENT, "Bp::stopEnrollment",
                                      "stopEnrollment error: %s"};
constexpr ProxyRow kScan = {SCAN, "Bp::scan", "scan error: %s"};
constexpr ProxyRow kStartMatching = {START_MATCHING, "Bp::startMatching",
                                     "startMatching error: %s"};
constexpr ProxyRow kStopMatching = {STOP_MATCHING, "Bp::stopMatching", "stopMatching error: %s"};
constexpr ProxyRow kCancelScan = {CANCEL_SCAN, "Bp::cancelScan", "cancelScan error: %s"};
constexpr ProxyRow kSetSecurity = {SET_SECURITY, "Bp::setSecurity", "setSecurity error: %s"};
constexpr ProxyRow kSetProfileName = {SET_PROFILENAME, "Bp::setProfileName",
                                      "setProfileName error: %s"};
constexpr ProxyRow kDeleteProfile = {DELETE_PROFILE, "Bp::deleteProfile",
                                     "deleteProfile error: %s"};
constexpr ProxyRow kRenameProfile = {RENAME_PROFILE, "Bp::renameProfile",
                                     "renameProfile error: %s"};
constexpr ProxyRow kGetMaxUser = {GET_MAXUSER, "Bp::getMaxUser enter", "getMaxUser error: %s"};
constexpr ProxyRow kGetProfileList = {GET_PROFILELIST, "Bp::getProfileList enter",
                                      "getProfileList error: %s"};
constexpr ProxyRow kEnableWakeup = {ENABLE_WAKEUP, "Bp::enableWakeup", "enable() error: %s"};
constexpr ProxyRow kDisableWakeup = {DISABLE_WAKEUP, "Bp::disableWakeup", "disable() error: %s"};

}  // namespace

// ---- proxy ----

namespace {

struct Call : ManagerCall {
    explicit Call(const ProxyRow& row)
            : ManagerCall(LOG_TAG, row, IHandBiometricManagerService::descriptor) {}

    // For the operations on names. Null has no form on the wire, and left out it would put the next
    // name in its place.
    int transactWithNames(IBinder* remote, std::initializer_list<const char*> names) {
        for (const char* name : names) {
            if (name == nullptr) {
                return STATUS_NULL_POINTER;
            }
            request.writeCString(name);
        }
        return transactForStatus(remote);
    }
};

}  // namespace

IMPLEMENT_SUBSCRIPTION(HandBiometricManagerService, IHandBiometricManagerClient)

int BpHandBiometricManagerService::startEnrollment() {
    return Call(kStartEnrollment).transactForStatus(remote());
}

int BpHandBiometricManagerService::stopEnrollment() {
    return Call(kStopEnrollment).transactForStatus(remote());
}

int BpHandBiometricManagerService::scan() {
    return Call(kScan).transactForStatus(remote());
}

int BpHandBiometricManagerService::startMatching() {
    return Call(kStartMatching).transactForStatus(remote());
}

int BpHandBiometricManagerService::stopMatching() {
    return Call(kStopMatching).transactForStatus(remote());
}

int BpHandBiometricManagerService::cancelScan() {
    return Call(kCancelScan).transactForStatus(remote());
}

int BpHandBiometricManagerService::setSecurity(int level) {
    Call call(kSetSecurity);
    call.request.writeInt32(level);
    return call.transactForStatus(remote());
}

int BpHandBiometricManagerService::setProfileName(const char* name) {
    return Call(kSetProfileName).transactWithNames(remote(), {name});
}

int BpHandBiometricManagerService::deleteProfile(const char* name) {
    return Call(kDeleteProfile).transactWithNames(remote(), {name});
}

int BpHandBiometricManagerService::renameProfile(const char* first, const char* second) {
    return Call(kRenameProfile).transactWithNames(remote(), {first, second});
}

int BpHandBiometricManagerService::getMaxUser(unsigned int& count) {
    return Call(kGetMaxUser).transactForValue(remote(), count);
}

int BpHandBiometricManagerService::getProfileList(std::vector<std::string>& names) {
    Call call(kGetProfileList);
    int status = call.transact(remote());
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    const int32_t count = call.reply.readInt32();
    for (int32_t i = 0; i < count; ++i) {
        // The last number of a reply is the status: its bytes must not become a name.
        const bool onlyStatus = call.reply.dataAvail() <= sizeof(int32_t);
        const char* name = onlyStatus ? nullptr : call.reply.readCString();
        if (name == nullptr) {
            return STATUS_CORRUPT_DATA;
        }
        ALOGD("Bp::getProfileList pName is %s", name);
        names.emplace_back(name);
    }
    if (count > 0 && call.reply.dataAvail() < sizeof(int32_t)) {
        return STATUS_CORRUPT_DATA;
    }
    return call.readStatus();
}

int BpHandBiometricManagerService::enableWakeup() {
    return Call(kEnableWakeup).transactForStatus(remote());
}

int BpHandBiometricManagerService::disableWakeup() {
    return Call(kDisableWakeup).transactForStatus(remote());
}

IMPLEMENT_META_INTERFACE(HandBiometricManagerService, "pemaro.HandBiometricManagerService")

// ---- stub ----

namespace {

using Service = IHandBiometricManagerService;

template <int (Service::*kOperation)(const char*)>
status_t replyName(Service& service, const Parcel& data, Parcel& reply) {
    return replyStatus(reply, (service.*kOperation)(data.readCString()));
}

status_t onRenameProfile(Service& service, const Parcel& data, Parcel& reply) {
    const char* first = data.readCString();
    const char* second = data.readCString();
    return replyStatus(reply, service.renameProfile(first, second));
}

status_t onGetProfileList(Service& service, const Parcel&, Parcel& reply) {
    std::vector<std::string> names;
    int status = service.getProfileList(names);
    const int32_t count = static_cast<int32_t>(names.size());
    reply.writeInt32(count);
    for (int32_t i = 0; i < count; ++i) {
        // The proxy's prefix in the stub's text is known to log readers; it stays.
        ALOGD("Bp::GET_PROFILELIST transact write string %d", i);
        reply.writeCString(names[i].c_str());
    }
    return replyStatus(reply, status);
}

const StubRow<Service> kRows[] = {
        kSubscribeRow<Service, IHandBiometricManagerClient>,
        kUnsubscribeRow<Service, IHandBiometricManagerClient>,
        {replyPlain<&Service::startEnrollment>, "START_ENROLLMENT transact received..."},
        {replyPlain<&Service::stopEnrollment>, "STOP_ENROLLMENT transact received..."},
        {replyPlain<&Service::scan>, "SCAN transact received..."},
        {replyPlain<&Service::startMatching>, "START_MATCHING transact received..."},
        {replyPlain<&Service::stopMatching>, "STOP_MATCHING transact received..."},
        {replyPlain<&Service::cancelScan>, "CANCEL_SCAN transact received..."},
        {replyInt<&Service::setSecurity>, "SET_SECURITY transact received..."},
        {replyName<&Service::setProfileName>, "SET_PROFILENAME transact received..."},
        {replyName<&Service::deleteProfile>, "DELETE_PROFILE transact received..."},
        {onRenameProfile, "RENAME_PROFILE transact received..."},
        {replyNumber<&Service::getMaxUser, unsigned int>, "GET_MAXUSER transact received...",
         "GET_MAXUSER transact finished..."},
        {onGetProfileList, "GET_PROFILELIST transact received...",
         "GET_PROFILELIST transact finished..."},
        {replyPlain<&Service::enableWakeup>, "ENABLE_WAKEUP transact received..."},
        {replyPlain<&Service::disableWakeup>, "DISABLE_WAKEUP transact received..."},
};
static_assert(sizeof(kRows) / sizeof(kRows[0]) + 1 == END_OF_CODES, "one row a code");

}  // namespace

IMPLEMENT_STUB(HandBiometricManagerService, kRows)

}  // namespace pemaro
