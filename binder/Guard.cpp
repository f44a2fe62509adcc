// SPDX-License-Identifier: Apache-2.0
#include "binder/Guard.h"

namespace pemaro {

namespace {

// Without a destructor: clients may live longer than a static object.
pthread_mutex_t gGuard = PTHREAD_MUTEX_INITIALIZER;

}  // namespace

ClientGuard::ClientGuard() {
    pthread_mutex_lock(&gGuard);
}

ClientGuard::~ClientGuard() {
    pthread_mutex_unlock(&gGuard);
}

}  // namespace pemaro
