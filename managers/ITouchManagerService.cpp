// SPDX-License-Identifier: Apache-2.0
// The touch manager's transactions, both sides: first the codes and the texts of each operation,
// then the proxy, the meta-interface and the stub. docs/manager-protocol.md lists the parcels.

#define LOG_TAG "ITouchManagerService"

#include "pemaro/ITouchManagerService.h"

#include "managers/ManagerCall.h"
#include "pemaro/BnTouchManagerService.h"
#include "pemaro/BpTouchManagerService.h"

namespace pemaro {

using android::IBinder;
using android::Parcel;
using android::Rect;
using android::sp;
using android::status_t;

namespace {

enum {
    SUBSCRIBE = IBinder::FIRST_CALL_TRANSACTION,
    UNSUBSCRIBE,
    IS_SUPPORTED,
    IS_ENABLED,
    ENABLE,
    DISABLE,
    CONFIGURE_VM_REGION,
    END_OF_CODES,  // stays the last
};

constexpr ProxyRow kIsSupported = {IS_SUPPORTED, "Bp::isSupported", "isSupported() error: %s"};
constexpr ProxyRow kIsEnabled = {IS_ENABLED, "Bp::isEnabled", "isEnabled() error: %s"};
constexpr ProxyRow kEnable = {ENABLE, "Bp::enable", "enable() error: %s"};
constexpr ProxyRow kDisable = {DISABLE, "Bp::disable", "disable() error: %s"};
constexpr ProxyRow kConfigureVmRegion = {CONFIGURE_VM_REGION, "Bp::configure_vm_region",
                                         "configure_vm_region() error: %s"};

// A region's fields in their order on the wire, which is not that of the structure: the two sides
// have always spoken it so.
constexpr int32_t Rect::*kRegionFields[] = {&Rect::top, &Rect::left, &Rect::bottom, &Rect::right};

}  // namespace

// ---- proxy ----

namespace {

struct Call : ManagerCall {
    explicit Call(const ProxyRow& row)
            : ManagerCall(LOG_TAG, row, ITouchManagerService::descriptor) {}
};

}  // namespace

IMPLEMENT_SUBSCRIPTION(TouchManagerService, ITouchManagerClient)

int BpTouchManagerService::isSupported(int feature, bool& supported) {
    Call call(kIsSupported);
    call.request.writeInt32(feature);
    return call.transactForValue(remote(), supported);
}

int BpTouchManagerService::isEnabled(int feature, bool& enabled) {
    Call call(kIsEnabled);
    call.request.writeInt32(feature);
    return call.transactForValue(remote(), enabled);
}

int BpTouchManagerService::enable(int feature) {
    Call call(kEnable);
    call.request.writeInt32(feature);
    return call.transactForStatus(remote());
}

int BpTouchManagerService::disable(int feature) {
    Call call(kDisable);
    call.request.writeInt32(feature);
    return call.transactForStatus(remote());
}

int BpTouchManagerService::configure_vm_region(Rect& region, bool flag) {
    Call call(kConfigureVmRegion);
    for (auto field : kRegionFields) {
        call.request.writeInt32(region.*field);
    }
    call.request.writeInt32(flag ? 1 : 0);
    return call.transactForStatus(remote());
}

IMPLEMENT_META_INTERFACE(TouchManagerService, "pemaro.TouchManagerService")

// ---- stub ----

namespace {

using Service = ITouchManagerService;

template <int (Service::*kOperation)(int, bool&)>
status_t replyAnswer(Service& service, const Parcel& data, Parcel& reply) {
    int feature = data.readInt32();
    return replyValue<bool>(reply,
                            [&](bool& answer) { return (service.*kOperation)(feature, answer); });
}

status_t onConfigureVmRegion(Service& service, const Parcel& data, Parcel& reply) {
    Rect region(0, 0, 0, 0);  // without arguments it would need libui's library
    for (auto field : kRegionFields) {
        region.*field = data.readInt32();
    }
    bool flag = data.readInt32() != 0;
    return replyStatus(reply, service.configure_vm_region(region, flag));
}

const StubRow<Service> kRows[] = {
        kSubscribeRow<Service, ITouchManagerClient>,
        kUnsubscribeRow<Service, ITouchManagerClient>,
        {replyAnswer<&Service::isSupported>, "IS_SUPPORTED transact received..."},
        {replyAnswer<&Service::isEnabled>, "IS_ENABLED transact received..."},
        {replyInt<&Service::enable>, "ENABLE transact received..."},
        {replyInt<&Service::disable>, "DISABLE transact received..."},
        {onConfigureVmRegion, "CONFIGURE_VM_REGION transact received..."},
};
static_assert(sizeof(kRows) / sizeof(kRows[0]) + 1 == END_OF_CODES, "one row a code");

}  // namespace

IMPLEMENT_STUB(TouchManagerService, kRows)

}  // namespace pemaro
