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
};

constexpr ProxyRow kIsSupported =
        managerRow(IS_SUPPORTED, "Bp::isSupported", "isSupported() error: %s");
constexpr ProxyRow kIsEnabled = managerRow(IS_ENABLED, "Bp::isEnabled", "isEnabled() error: %s");
constexpr ProxyRow kEnable = managerRow(ENABLE, "Bp::enable", "enable() error: %s");
constexpr ProxyRow kDisable = managerRow(DISABLE, "Bp::disable", "disable() error: %s");
constexpr ProxyRow kConfigureVmRegion = managerRow(CONFIGURE_VM_REGION, "Bp::configure_vm_region",
                                                   "configure_vm_region() error: %s");

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

BpTouchManagerService::BpTouchManagerService(const sp<IBinder>& remote)
        : BpInterface<ITouchManagerService>(remote) {}

int BpTouchManagerService::subscribe(const sp<ITouchManagerClient>& client) {
    return Call(kSubscribe).transactWithClient(remote(), client);
}

int BpTouchManagerService::unsubscribe(const sp<ITouchManagerClient>& client) {
    return Call(kUnsubscribe).transactWithClient(remote(), client);
}

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
        {"SUBSCRIBE transact received...", replyClient<&Service::subscribe, ITouchManagerClient>},
        {"UNSUBSCRIBE transact received...",
         replyClient<&Service::unsubscribe, ITouchManagerClient>},
        {"IS_SUPPORTED transact received...", replyAnswer<&Service::isSupported>},
        {"IS_ENABLED transact received...", replyAnswer<&Service::isEnabled>},
        {"ENABLE transact received...", replyInt<&Service::enable>},
        {"DISABLE transact received...", replyInt<&Service::disable>},
        {"CONFIGURE_VM_REGION transact received...", onConfigureVmRegion},
};
static_assert(sizeof(kRows) / sizeof(kRows[0]) == CONFIGURE_VM_REGION, "one row a code");

}  // namespace

status_t BnTouchManagerService::onTransact(uint32_t code, const Parcel& data, Parcel* reply,
                                           uint32_t flags) {
    Service& service = *this;
    return dispatch(LOG_TAG, kRows, *this, service, code, data, reply,
                    [&] { return BBinder::onTransact(code, data, reply, flags); });
}

}  // namespace pemaro
