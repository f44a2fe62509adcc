// SPDX-License-Identifier: Apache-2.0
#include "binder/ServiceLookup.h"

#include <binder/IServiceManager.h>
#include <utils/String16.h>

#include "binder/Log.h"
#include "binder/PlatformShims.h"
#include "binder/Waiting.h"

namespace pemaro {

using android::IBinder;
using android::IServiceManager;
using android::sp;
using android::String16;

namespace {

constexpr int kLookupAttempts = 10;
constexpr useconds_t kLookupPauseMicros = 500000;

sp<IServiceManager> serviceManager(const char* tag) {
    sp<IServiceManager> manager = android::defaultServiceManager();
    if (manager == nullptr) {
        logText(ANDROID_LOG_ERROR, tag, "couldn't get default service manager");
    }
    return manager;
}

}  // namespace

sp<IBinder> findService(const char* tag, const char* name) {
    sp<IServiceManager> manager = serviceManager(tag);
    if (manager == nullptr) {
        return nullptr;
    }
    sp<IBinder> binder = polledService(*manager, String16(name));
    if (binder == nullptr) {
        logText(ANDROID_LOG_ERROR, tag, "couldn't find the service");
    }
    return binder;
}

sp<IBinder> awaitService(const char* tag, const char* name) {
    sp<IServiceManager> manager = serviceManager(tag);
    if (manager == nullptr) {
        return nullptr;
    }
    for (int attempt = 0; attempt < kLookupAttempts; ++attempt) {
        sp<IBinder> binder = polledService(*manager, String16(name));
        if (binder != nullptr) {
            return binder;
        }
        __android_log_print(ANDROID_LOG_DEBUG, tag,
                            "get service attempt #%d of %d...couldn't find service", attempt,
                            kLookupAttempts);
        waitHooks().sleepMicros(kLookupPauseMicros);
    }
    logText(ANDROID_LOG_ERROR, tag, "couldn't find service");
    return nullptr;
}

}  // namespace pemaro
