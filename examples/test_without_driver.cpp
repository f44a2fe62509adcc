// SPDX-License-Identifier: Apache-2.0
// Tests a program's use of the library with the test kit: a service that answers as it is told, a
// service manager that knows it, and the log, all in this process and without a Binder driver. (Any
// test framework will do; this one has none.)
//
//     test_without_driver
//
// The exit status is 0, or 1 with a line on stderr for what did not hold.

#include <cstdio>
#include <cstdlib>

#include "pemaro/BasicGestureManagerService.h"
#include "pemaro/GestureManagerClient.h"
#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "pemaro/testkit/FakeTouchCompanionService.h"
#include "pemaro/testkit/LogRecorder.h"
#include "pemaro/testkit/Watchable.h"

namespace {

using android::sp;
using pemaro::GestureManagerClient;
using pemaro::TouchCompanionClient;
using pemaro::test::FakeTouchCompanionService;
using pemaro::test::LogRecorder;
using pemaro::test::ScopedServiceManager;
using pemaro::test::Watchable;

int gFailures = 0;

void expect(bool held, const char* what) {
    if (!held) {
        fprintf(stderr, "test_without_driver: not so: %s\n", what);
        gFailures += 1;
    }
}

void testCalls() {
    ScopedServiceManager services;
    const sp<FakeTouchCompanionService> service = new FakeTouchCompanionService;
    service->packetSize = 512;
    services->add("pemaro.TouchService", service);

    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    expect(client->init() == pemaro::STATUS_NO_ERROR, "a client connects to the service");
    expect(client->getPacketSize() == 512, "it is given what the service answers");
    expect(service->calls().back() == "getPacketSize", "the service notes what it is asked");
}

void testFailure() {
    ScopedServiceManager services;
    const sp<FakeTouchCompanionService> service = new FakeTouchCompanionService;
    service->setStatus("open", pemaro::STATUS_INVALID_STATE);
    services->add("pemaro.TouchService", service);
    LogRecorder::instance().clear();

    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    expect(client->init() == pemaro::STATUS_INVALID_STATE, "a refusal reaches the caller");
    expect(!LogRecorder::instance().lines().empty(), "and is logged");
}

// A service to be watched, which the platform grants for none of the same process.
void testDeath() {
    ScopedServiceManager services;
    using Service = Watchable<pemaro::BasicGestureManagerService>;
    const sp<Service> service = new Service;
    services->add("pemaro.GestureManagerService", service);

    int deaths = 0;
    const auto onDeath = [](void* context) { *static_cast<int*>(context) += 1; };
    const sp<GestureManagerClient> client = new GestureManagerClient(nullptr, onDeath, &deaths);
    expect(client->init() == pemaro::STATUS_NO_ERROR, "a client watches the service");
    service->die();
    expect(deaths == 1, "it is told of the death");
    expect(client->enableWakeup() == pemaro::STATUS_UNKNOWN_ERROR, "and nobody answers any more");
    // In one process a client and its service would keep each other.
    client->deinit();
}

}  // namespace

int main() {
    testCalls();
    testFailure();
    testDeath();
    if (gFailures == 0) {
        puts("all held");
    }
    return gFailures == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
}
