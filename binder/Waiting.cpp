// SPDX-License-Identifier: Apache-2.0
#include "binder/Waiting.h"

namespace pemaro {

WaitHooks& waitHooks() {
    static WaitHooks hooks = {pthread_cond_timedwait, usleep};
    return hooks;
}

}  // namespace pemaro
