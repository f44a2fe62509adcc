// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "pemaro/Binder.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "simulator/ServiceKind.h"
#include "simulator/managers/ManagerOptions.h"
#include "tests/support/RecordCollector.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::simulator {

/// A simulated manager in this process, with a client of the library that is connected to it. Its
/// clock stands still: events come when the test calls tick().
template <typename Simulator, typename Client>
class ManagerSimulatorTest : public testing::Test {
  protected:
    ManagerSimulatorTest(ServiceKind kind, const android::sp<Client>& aClient) : client(aClient) {
        // A binder of this process cannot be watched for its death; this one stands before it.
        const android::sp<test::RecordingBinder> remote = new test::RecordingBinder;
        remote->forwardTo(service);
        services->add(registeredName(kind), remote);
        EXPECT_EQ(0, client->init());
    }

    ~ManagerSimulatorTest() override {
        client->deinit();
        service->shutDown();
    }

    static ManagerOptions stillOptions() {
        ManagerOptions options;
        options.gestureRate = 0;
        options.handRate = 0;
        options.userGestures = 2;
        options.handProfiles = 2;
        return options;
    }

    void tick(int times) {
        for (int i = 0; i < times; ++i) {
            service->tick();
        }
    }

    void order(const char* text) {
        std::string problem;
        const auto fault = Fault::parse(text, &problem);
        ASSERT_TRUE(fault) << problem;
        service->faults().add(*fault);
    }

    test::ScopedServiceManager services;
    test::RecordCollector events;
    android::sp<Simulator> service = new Simulator(stillOptions());
    android::sp<Client> client;
};

}  // namespace pemaro::simulator
