// SPDX-License-Identifier: Apache-2.0
#include "pemaro/TouchCompanionSharedCblk.h"

namespace pemaro {

TouchCompanionSharedCblk::TouchCompanionSharedCblk()
        : read(0),
          write(0),
          readWrap(0),
          writeWrap(0),
          data(nullptr),
          headerSize(120),
          bufferFrames(0),
          frameSize(0) {
    pthread_mutexattr_t mutexAttr;
    pthread_mutexattr_init(&mutexAttr);
    pthread_mutexattr_setpshared(&mutexAttr, PTHREAD_PROCESS_SHARED);
    pthread_mutex_init(&mutex, &mutexAttr);
    pthread_mutexattr_destroy(&mutexAttr);

    pthread_condattr_t condAttr;
    pthread_condattr_init(&condAttr);
    pthread_condattr_setpshared(&condAttr, PTHREAD_PROCESS_SHARED);
    pthread_cond_init(&cond, &condAttr);
    pthread_condattr_destroy(&condAttr);
}

}  // namespace pemaro
