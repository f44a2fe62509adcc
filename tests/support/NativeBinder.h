// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace pemaro::test {

// Binder in one process, without a driver: what the tests that need no second process run on.
//
// libbinder will not work before it has opened a driver, and even a request's interface token needs
// it. A test program that links this library opens /dev/zero in the driver's place before its tests
// start, and its ioctl() plays the driver: it tells the protocol version, takes every command as
// consumed, and answers a transaction to another process, of which there is none, as one to a dead
// process. Local binders, parcels that carry them, proxies around local binders and shared memory
// work in full.

/// Opens /dev/zero as the driver: for programs without GoogleTest, where nothing does it for them.
void openDriver();

/// How often libbinder has handed its queued commands to the driver.
int driverWrites();

}  // namespace pemaro::test
