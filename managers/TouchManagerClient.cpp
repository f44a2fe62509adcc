// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "TouchManagerClient"

#include "pemaro/TouchManagerClient.h"

#include <log/log.h>

#include "binder/Guard.h"
#include "binder/ServiceCall.h"
#include "managers/ManagerConnection.h"
#include "pemaro/Status.h"

namespace pemaro {

using android::IBinder;
using android::Rect;
using android::sp;

namespace {

constexpr ManagerTexts kTexts = {LOG_TAG, "pemaro.TouchManagerService", "Init successful: X",
                                 nullptr};

using Connection = ManagerConnection<ITouchManagerService, ITouchManagerClient>;
using Service = ITouchManagerService;

}  // namespace

TouchManagerClient::GestureCallback TouchManagerClient::mCallback = nullptr;
void* TouchManagerClient::mCtx = nullptr;

TouchManagerClient::TouchManagerClient(GestureCallback callback, void* ctx) : TouchManagerClient() {
    ClientGuard guard;
    mCallback = callback;
    mCtx = ctx;
}

TouchManagerClient::TouchManagerClient() {
    ALOGD("TouchManagerClient(): this = %p", this);
}

TouchManagerClient::~TouchManagerClient() {
    ALOGD("~TouchManagerClient: E: this = %p", this);
    if (mInitialized) {
        mService.clear();
    }
    ALOGD("~TouchManagerClient(): X");
}

int TouchManagerClient::init() {
    Connection connection(kTexts, mInitialized, mService, this);
    ALOGD("init: E");
    sp<IBinder> binder = findService(LOG_TAG, kTexts.serviceName);
    if (binder == nullptr) {
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    const sp<Service> service = connection.hold(binder);
    if (service == nullptr) {
        return STATUS_BAD_PARAMETER;
    }
    ALOGD("before subscribe: mTchMgrClient ref count = %d", getStrongCount());
    int status = service->subscribe(this);
    ALOGD("after subscribe: mTchMgrClient ref count = %d", getStrongCount());
    return status == STATUS_NO_ERROR ? connection.connected(service) : connection.refused(status);
}

int TouchManagerClient::deinit() {
    return Connection(kTexts, mInitialized, mService, this).deinit(nullptr);
}

// configure_vm_region fails with disable's text. Log readers know it so; it stays.

int TouchManagerClient::isSupported(int feature, bool& supported) {
    return callService({LOG_TAG, "isSupported failed: %s"}, mService, &Service::isSupported,
                       feature, supported);
}

int TouchManagerClient::isEnabled(int feature, bool& enabled) {
    return callService({LOG_TAG, "isEnabled failed: %s"}, mService, &Service::isEnabled, feature,
                       enabled);
}

int TouchManagerClient::enable(int feature) {
    return callService({LOG_TAG, "enable failed: %s"}, mService, &Service::enable, feature);
}

int TouchManagerClient::disable(int feature) {
    return callService({LOG_TAG, "disable failed: %s"}, mService, &Service::disable, feature);
}

int TouchManagerClient::configure_vm_region(Rect& region, bool flag) {
    return callService({LOG_TAG, "disable failed: %s"}, mService, &Service::configure_vm_region,
                       region, flag);
}

int TouchManagerClient::gestureCallback(ITouchManagerClient::GestureData* data) {
    Connection connection(kTexts, mInitialized, mService, this);
    ALOGE("Gesture event detected (client address = %p)", this);
    GestureCallback callback;
    void* context;
    {
        ClientGuard guard;  // for both: another client's constructor replaces the pair
        callback = mCallback;
        context = mCtx;
    }
    if (connection.accepts(callback, context, "callback is null")) {
        callback(data, context);
    }
    return STATUS_NO_ERROR;
}

}  // namespace pemaro
