// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <pthread.h>
#include <time.h>
#include <unistd.h>

namespace pemaro {

/// How the lookup of a service and the ring's reader wait, in one place so that tests can replace it.
struct WaitHooks {
    int (*condTimedWait)(pthread_cond_t* cond, pthread_mutex_t* mutex, const timespec* deadline);
    int (*sleepMicros)(useconds_t micros);
};

WaitHooks& waitHooks();

}  // namespace pemaro
