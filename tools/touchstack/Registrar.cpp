// SPDX-License-Identifier: Apache-2.0
#include "tools/touchstack/Registrar.h"

#include <binder/IPCThreadState.h>
#include <binder/Parcel.h>
#include <utils/String16.h>

namespace pemaro::touchstack {
namespace {

using android::IBinder;
using android::Parcel;
using android::sp;
using android::String16;

/// The handle that is the service manager's in every process.
constexpr int32_t kManager = 0;
constexpr uint32_t kCheckService = IBinder::FIRST_CALL_TRANSACTION + 1;
constexpr uint32_t kAddService = IBinder::FIRST_CALL_TRANSACTION + 2;
/// The platform's DUMP_FLAG_PRIORITY_DEFAULT.
constexpr int32_t kDumpPriority = 1 << 3;

/// False when there is no service manager, or when it refuses.
bool transact(uint32_t code, const Parcel& data, Parcel* reply) {
    return android::IPCThreadState::self()->transact(kManager, code, data, reply, 0) ==
                   android::OK &&
           reply->readExceptionCode() == 0;
}

void begin(Parcel& data, const std::string& name) {
    data.writeInterfaceToken(String16("android.os.IServiceManager"));
    data.writeString16(String16(name.c_str()));
}

bool lookUp(const std::string& name, sp<IBinder>* service) {
    Parcel data;
    Parcel reply;
    begin(data, name);
    return transact(kCheckService, data, &reply) &&
           reply.readNullableStrongBinder(service) == android::OK;
}

bool add(const std::string& name, const sp<IBinder>& service) {
    Parcel data;
    Parcel reply;
    begin(data, name);
    data.writeStrongBinder(service);
    data.writeInt32(0);  // not for isolated processes
    data.writeInt32(kDumpPriority);
    return transact(kAddService, data, &reply);
}

}  // namespace

Registrar::Registrar(Services services, std::function<void(const std::string&)> tell)
        : mServices(std::move(services)), mTell(std::move(tell)) {}

void Registrar::check() {
    if (mServices.empty()) {
        return;
    }
    sp<IBinder> known;
    const bool isThere = lookUp(mServices.front().first, &known);
    if (!isThere) {
        if (mManagerThere) {
            mTell("the service manager died; nobody new finds the services");
        }
        mManagerThere = false;
        return;
    }
    const bool isNew = known == nullptr || !mManagerThere;
    mManagerThere = true;
    if (!isNew) {
        return;
    }
    for (const auto& [name, service] : mServices) {
        if (!add(name, service)) {
            mTell("the new service manager refused " + name);
            return;
        }
    }
    mTell("registered again with the new service manager");
}

}  // namespace pemaro::touchstack
