// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>

namespace pemaro::test {

// Binder in one process, without a driver: what tests that need no second process run on.
//
// libbinder will not work before it has opened a driver, and even a request's interface token needs
// it. A program that calls openDriver() opens /dev/zero in the driver's place, and its ioctl() plays
// the driver: it tells the protocol version, takes every command as consumed, and answers a
// transaction to another process, of which there is none, as one to a dead process. Local binders,
// parcels that carry them, proxies around local binders and shared memory work in full.

/// Opens /dev/zero as the driver; again, nothing. To be called before Binder is used otherwise; a
/// ScopedServiceManager does it as well.
void openDriver();

/// What android::defaultServiceManager() returns from now on, in a program that calls this or
/// openDriver(): null until it is set.
void useServiceManager(const android::sp<android::IServiceManager>& manager);

/// How often libbinder has handed its queued commands to the driver.
int driverWrites();

}  // namespace pemaro::test
