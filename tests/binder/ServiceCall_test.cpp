// SPDX-License-Identifier: Apache-2.0
#include "binder/ServiceCall.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/support/LogLines.h"

namespace pemaro::test {
namespace {

using android::sp;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

struct Service : android::RefBase {
    int add(int first, int& second) {
        second += first;
        return answer;
    }

    int answer = STATUS_NO_ERROR;
};

class ServiceCall : public ::testing::Test {
  protected:
    void SetUp() override { clearLog(); }

    int number = 1;
    sp<Service> service = new Service;
};

TEST_F(ServiceCall, PassesArgumentsAndStatusOn) {
    EXPECT_EQ(STATUS_NO_ERROR, callService({"Tag", "failed"}, service, &Service::add, 2, number));
    EXPECT_EQ(3, number);
    EXPECT_THAT(linesOf("Tag"), IsEmpty());
}

TEST_F(ServiceCall, CallsAFunctionOnTheService) {
    EXPECT_EQ(5, callService({"Tag", nullptr}, service, [&](Service& held) {
                  EXPECT_EQ(service.get(), &held);
                  return 5;
              }));
    EXPECT_THAT(linesOf("Tag"), IsEmpty());
}

TEST_F(ServiceCall, LogsAFailureWithOrWithoutItsMessage) {
    service->answer = STATUS_NOT_FOUND;
    EXPECT_EQ(STATUS_NOT_FOUND,
              callService({"Tag", "add failed: %s"}, service, &Service::add, 2, number));
    EXPECT_EQ(STATUS_NOT_FOUND, callService({"Tag", "add failed", WithoutService::Quiet}, service,
                                            &Service::add, 2, number));
    EXPECT_THAT(linesOf("Tag"), ElementsAre("E add failed: Not Found", "E add failed"));
}

TEST_F(ServiceCall, AnswersInvalidStateWithoutAService) {
    service.clear();
    EXPECT_EQ(STATUS_INVALID_STATE,
              callService({"Tag", "add failed: %s"}, service, &Service::add, 2, number));
    EXPECT_THAT(linesOf("Tag"), ElementsAre("E add failed: Invalid state"));
    clearLog();
    EXPECT_EQ(STATUS_INVALID_STATE, callService({"Tag", "add failed", WithoutService::Quiet},
                                                service, &Service::add, 2, number));
    EXPECT_THAT(linesOf("Tag"), IsEmpty());
    EXPECT_EQ(1, number);
}

// A callback on the same thread may let go of the service in the middle of a call.
TEST_F(ServiceCall, KeepsTheServiceForTheCall) {
    const android::wp<Service> watched = service;
    callService({"Tag", nullptr}, service, [&](Service&) {
        service.clear();
        EXPECT_NE(nullptr, watched.promote());
        return STATUS_NO_ERROR;
    });
    EXPECT_EQ(nullptr, watched.promote());
}

}  // namespace
}  // namespace pemaro::test
