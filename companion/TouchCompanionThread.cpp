// SPDX-License-Identifier: Apache-2.0
#include "companion/TouchCompanionThread.h"

#include "pemaro/TouchCompanionClient.h"

namespace pemaro {

TouchCompanionThread::TouchCompanionThread(TouchCompanionClient& client)
        : android::Thread(true /* canCallJava */), mClient(client) {}

void TouchCompanionThread::requestExit() {
    android::Thread::requestExit();
}

bool TouchCompanionThread::threadLoop() {
    mClient.processData();
    return true;
}

}  // namespace pemaro
