// SPDX-License-Identifier: Apache-2.0
#include "binder/ServiceLookup.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "pemaro/testkit/FakeServiceManager.h"
#include "tests/support/FakeWaits.h"
#include "tests/support/LogLines.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::sp;
using ::testing::Each;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

class ServiceLookup : public ::testing::Test {
  protected:
    void SetUp() override { clearLog(); }

    FakeWaits waits;
    const sp<RecordingBinder> binder = new RecordingBinder;
};

TEST_F(ServiceLookup, NeedsAServiceManager) {
    EXPECT_EQ(nullptr, findService("Tag", "name"));
    EXPECT_EQ(nullptr, awaitService("Tag", "name"));
    EXPECT_THAT(linesOf("Tag"), ElementsAre("E couldn't get default service manager",
                                            "E couldn't get default service manager"));
    EXPECT_THAT(waits.sleeps(), IsEmpty());
}

TEST_F(ServiceLookup, FindsAServiceAtOnce) {
    ScopedServiceManager services;
    services->add("name", binder);
    EXPECT_EQ(binder, findService("Tag", "name"));
    EXPECT_EQ(binder, awaitService("Tag", "name"));
    EXPECT_EQ(2, services->lookups("name"));
    EXPECT_THAT(linesOf("Tag"), IsEmpty());
    EXPECT_THAT(waits.sleeps(), IsEmpty());
}

TEST_F(ServiceLookup, AsksOnceWhereItDoesNotWait) {
    ScopedServiceManager services;
    EXPECT_EQ(nullptr, findService("Tag", "name"));
    EXPECT_EQ(1, services->lookups("name"));
    EXPECT_THAT(linesOf("Tag"), ElementsAre("E couldn't find the service"));
    EXPECT_THAT(waits.sleeps(), IsEmpty());
}

// Attempts are counted from 0, and the last one is slept after as well.
TEST_F(ServiceLookup, GivesUpAfterTenAttempts) {
    ScopedServiceManager services;
    EXPECT_EQ(nullptr, awaitService("Tag", "name"));
    EXPECT_EQ(10, services->lookups("name"));
    Lines expected;
    for (int attempt = 0; attempt < 10; ++attempt) {
        expected.push_back("D get service attempt #" + std::to_string(attempt) +
                           " of 10...couldn't find service");
    }
    expected.push_back("E couldn't find service");
    EXPECT_EQ(expected, linesOf("Tag"));
    EXPECT_EQ(10u, waits.sleeps().size());
    EXPECT_THAT(waits.sleeps(), Each(500000u));
}

TEST_F(ServiceLookup, FindsAServiceThatComesLater) {
    ScopedServiceManager services;
    services->onLookup([&](const std::string& name, int attempt) {
        if (attempt == 3) {
            services->add(name, binder);
        }
    });
    EXPECT_EQ(binder, awaitService("Tag", "name"));
    EXPECT_THAT(linesOf("Tag"),
                ElementsAre("D get service attempt #0 of 10...couldn't find service",
                            "D get service attempt #1 of 10...couldn't find service"));
    EXPECT_THAT(waits.sleeps(), ElementsAre(500000u, 500000u));
}

}  // namespace
}  // namespace pemaro::test
