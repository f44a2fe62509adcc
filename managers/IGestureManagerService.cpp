// SPDX-License-Identifier: Apache-2.0
// The gesture manager's transactions, both sides: first the codes and the texts of each operation,
// then the proxy, the meta-interface and the stub. docs/manager-protocol.md lists the parcels.

#define LOG_TAG "IGestureManagerService"

#include "pemaro/IGestureManagerService.h"

#include "managers/ManagerCall.h"
#include "pemaro/BnGestureManagerService.h"
#include "pemaro/BpGestureManagerService.h"

namespace pemaro {

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;
using Gesture = IGestureManagerClient::GestureData;

namespace {

enum {
    SUBSCRIBE = IBinder::FIRST_CALL_TRANSACTION,
    UNSUBSCRIBE,
    ENABLE_WAKEUP,
    DISABLE_WAKEUP,
    ENABLE,
    DISABLE,
    ADD_GESTURE,
    DELETE_GESTURE,
    ENABLE_GESTURE,
    DISABLE_GESTURE,
    VERIFY_GESTURE,
    GET_MAX_PREDEFINED_GESTURE,
    GET_MAX_USERDEFINED_GESTURE,
    END_OF_CODES,  // stays the last
};

// Log readers know these texts so; they stay: the wake-up operations fail as "enable()" and
// "disable()", the limits fail without parentheses, and what the transactions call ENABLE, DISABLE
// and VERIFY_GESTURE the operations call otherwise.
constexpr ProxyRow kEnableWakeup = {ENABLE_WAKEUP, "Bp::enableWakeup", "enable() error: %s"};
constexpr ProxyRow kDisableWakeup = {DISABLE_WAKEUP, "Bp::disableWakeup", "disable() error: %s"};
constexpr ProxyRow kStartGestureDetection = {ENABLE, "Bp::startGestureDetection",
                                             "startGestureDetection() error: %s"};
constexpr ProxyRow kStopGestureDetection = {DISABLE, "Bp::stopGestureDetection",
                                            "stopGestureDetection() error: %s"};
constexpr ProxyRow kAddGesture = {ADD_GESTURE, "Bp::addGesture", "addGesture() error: %s"};
constexpr ProxyRow kDeleteGesture = {DELETE_GESTURE, "Bp::deleteGesture",
                                     "deleteGesture() error: %s"};
constexpr ProxyRow kEnableGesture = {ENABLE_GESTURE, "Bp::enableGesture",
                                     "enableGesture() error: %s"};
constexpr ProxyRow kDisableGesture = {DISABLE_GESTURE, "Bp::disableGesture",
                                      "disableGesture() error: %s"};
constexpr ProxyRow kImproveGestureTraining = {VERIFY_GESTURE, "Bp::improveGestureTraining",
                                              "improveGestureTraining() error: %s"};
constexpr ProxyRow kGetMaxPreDefinedGesture = {GET_MAX_PREDEFINED_GESTURE,
                                               "Bp::getMaxPreDefinedGesture enter",
                                               "getMaxPreDefinedGesture error: %s"};
constexpr ProxyRow kGetMaxUserDefinedGesture = {GET_MAX_USERDEFINED_GESTURE,
                                                "Bp::getMaxUserDefinedGesture enter",
                                                "getMaxUserDefinedGesture error: %s"};

}  // namespace

// ---- proxy ----

namespace {

struct Call : ManagerCall {
    explicit Call(const ProxyRow& row)
            : ManagerCall(LOG_TAG, row, IGestureManagerService::descriptor) {}
};

}  // namespace

IMPLEMENT_SUBSCRIPTION(GestureManagerService, IGestureManagerClient)

int BpGestureManagerService::enableWakeup() {
    return Call(kEnableWakeup).transactForStatus(remote());
}

int BpGestureManagerService::disableWakeup() {
    return Call(kDisableWakeup).transactForStatus(remote());
}

int BpGestureManagerService::startGestureDetection() {
    return Call(kStartGestureDetection).transactForStatus(remote());
}

int BpGestureManagerService::stopGestureDetection() {
    return Call(kStopGestureDetection).transactForStatus(remote());
}

int BpGestureManagerService::addGesture(int count, Gesture* samples, int& result) {
    Call call(kAddGesture);
    call.request.writeInt32(count);
    call.writeRecords(samples, count);
    return call.transactForValue(remote(), result);
}

int BpGestureManagerService::deleteGesture(int gesture) {
    Call call(kDeleteGesture);
    call.request.writeInt32(gesture);
    return call.transactForStatus(remote());
}

int BpGestureManagerService::enableGesture(int gesture) {
    Call call(kEnableGesture);
    call.request.writeInt32(gesture);
    return call.transactForStatus(remote());
}

int BpGestureManagerService::disableGesture(int gesture) {
    Call call(kDisableGesture);
    call.request.writeInt32(gesture);
    return call.transactForStatus(remote());
}

int BpGestureManagerService::improveGestureTraining(Gesture* sample, int& result) {
    Call call(kImproveGestureTraining);
    call.writeRecords(sample, 1);
    return call.transactForValue(remote(), result);
}

int BpGestureManagerService::getMaxPreDefinedGesture(unsigned int& count) {
    return Call(kGetMaxPreDefinedGesture).transactForValue(remote(), count);
}

int BpGestureManagerService::getMaxUserDefinedGesture(unsigned int& count) {
    return Call(kGetMaxUserDefinedGesture).transactForValue(remote(), count);
}

IMPLEMENT_META_INTERFACE(GestureManagerService, "pemaro.GestureManagerService")

// ---- stub ----

namespace {

using Service = IGestureManagerService;

status_t onAddGesture(Service& service, const Parcel& data, Parcel& reply) {
    int count = data.readInt32();
    Gesture* samples = readRecords<Gesture>(data, count);
    return replyValue<int>(reply,
                           [&](int& result) { return service.addGesture(count, samples, result); });
}

status_t onVerifyGesture(Service& service, const Parcel& data, Parcel& reply) {
    Gesture* sample = readRecords<Gesture>(data, 1);
    return replyValue<int>(
            reply, [&](int& result) { return service.improveGestureTraining(sample, result); });
}

const StubRow<Service> kRows[] = {
        kSubscribeRow<Service, IGestureManagerClient>,
        kUnsubscribeRow<Service, IGestureManagerClient>,
        {replyPlain<&Service::enableWakeup>, "ENABLE_WAKEUP transact received..."},
        {replyPlain<&Service::disableWakeup>, "DISABLE_WAKEUP transact received..."},
        {replyPlain<&Service::startGestureDetection>, "ENABLE transact received..."},
        {replyPlain<&Service::stopGestureDetection>, "DISABLE transact received..."},
        {onAddGesture, "ADD_GESTURE transact received..."},
        {replyInt<&Service::deleteGesture>, "DELETE_GESTURE transact received..."},
        {replyInt<&Service::enableGesture>, "ENABLE_GESTURE transact received..."},
        {replyInt<&Service::disableGesture>, "DISABLE_GESTURE transact received..."},
        {onVerifyGesture, "VERIFY_GESTURE transact received..."},
        {replyNumber<&Service::getMaxPreDefinedGesture, unsigned int>,
         "GET_MAX_PREDEFINED_GESTURE transact received...",
         "GET_MAX_PREDEFINED_GESTURE transact finished..."},
        {replyNumber<&Service::getMaxUserDefinedGesture, unsigned int>,
         "GET_MAX_USERDEFINED_GESTURE transact received...",
         "GET_MAX_USERDEFINED_GESTURE transact finished..."},
};
static_assert(sizeof(kRows) / sizeof(kRows[0]) + 1 == END_OF_CODES, "one row a code");

}  // namespace

IMPLEMENT_STUB(GestureManagerService, kRows)

}  // namespace pemaro
