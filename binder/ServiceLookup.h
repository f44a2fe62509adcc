// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

namespace pemaro {

/// The service called `name`, asked for once; null, with the reason logged, when there is none.
android::sp<android::IBinder> findService(const char* tag, const char* name);

/// The same in ten attempts, with half a second of sleep after each that failed.
android::sp<android::IBinder> awaitService(const char* tag, const char* name);

}  // namespace pemaro
