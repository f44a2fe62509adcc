// SPDX-License-Identifier: Apache-2.0
// A watchable service of the test kit, and the clients that watch it.

#include "pemaro/testkit/Watchable.h"

#include <gtest/gtest.h>

#include "pemaro/BasicGestureManagerService.h"
#include "pemaro/BasicHandBiometricManagerService.h"
#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/testkit/FakeServiceManager.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::sp;
using android::wp;

struct GestureService : BasicGestureManagerService {
    using Client = GestureManagerClient;
    using Record = IGestureManagerClient::GestureData;
    static constexpr char kName[] = "pemaro.GestureManagerService";
    using BasicGestureManagerService::report;
    int enableWakeup() override { return STATUS_NO_ERROR; }
};

struct HandService : BasicHandBiometricManagerService {
    using Client = HandBiometricManagerClient;
    using Record = IHandBiometricManagerClient::HandBioData;
    static constexpr char kName[] = "pemaro.HandBiometricManagerService";
    using BasicHandBiometricManagerService::report;
    int enableWakeup() override { return STATUS_NO_ERROR; }
};

struct Told {
    int events = 0;
    int deaths = 0;
};

template <typename Record>
void countEvent(Record*, void* told) {
    static_cast<Told*>(told)->events += 1;
}

void countDeath(void* told) {
    static_cast<Told*>(told)->deaths += 1;
}

template <typename T>
class WatchableService : public ::testing::Test {
  protected:
    using Client = typename T::Client;
    using Record = typename T::Record;

    sp<Watchable<T>> addService() {
        const sp<Watchable<T>> service = new Watchable<T>;
        mServices->add(T::kName, service);
        return service;
    }

    static void report(Watchable<T>& service) {
        static Record record;
        service.report(record);
    }

    ScopedServiceManager mServices;
    Told mTold;
    const sp<Client> mClient = new Client(countEvent<Record>, countDeath, &mTold);
};

using Services = ::testing::Types<GestureService, HandService>;
TYPED_TEST_SUITE(WatchableService, Services);

TYPED_TEST(WatchableService, IsServedUntilItDies) {
    const auto service = this->addService();
    ASSERT_EQ(STATUS_NO_ERROR, this->mClient->init());
    ASSERT_EQ(1u, service->links().size());
    EXPECT_EQ(STATUS_NO_ERROR, this->mClient->enableWakeup());
    this->report(*service);
    EXPECT_EQ(1, this->mTold.events);

    service->die();
    EXPECT_EQ(1, this->mTold.deaths);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, this->mClient->enableWakeup());
    EXPECT_EQ(android::DEAD_OBJECT, service->pingBinder());
    EXPECT_FALSE(service->isBinderAlive());
    service->die();
    EXPECT_EQ(1, this->mTold.deaths);

    EXPECT_EQ(STATUS_NO_ERROR, this->mClient->deinit());
    const auto next = this->addService();
    EXPECT_EQ(STATUS_NO_ERROR, this->mClient->init());
    EXPECT_EQ(STATUS_NO_ERROR, this->mClient->enableWakeup());
    next->die();
    EXPECT_EQ(2, this->mTold.deaths);
    // In one process both would keep each other.
    EXPECT_EQ(STATUS_NO_ERROR, this->mClient->deinit());
}

TYPED_TEST(WatchableService, ForgetsWhoEndsItsWatch) {
    const auto service = this->addService();
    ASSERT_EQ(STATUS_NO_ERROR, this->mClient->init());
    EXPECT_EQ(STATUS_NO_ERROR, this->mClient->deinit());
    EXPECT_EQ(0u, service->links().size());
    this->report(*service);
    service->die();
    EXPECT_EQ(0, this->mTold.events);
    EXPECT_EQ(0, this->mTold.deaths);
}

// As docs/manual.md tells: each init() subscribes and watches once more, deinit() undoes one.
TYPED_TEST(WatchableService, IsWatchedOnceMoreByEachInit) {
    const auto service = this->addService();
    ASSERT_EQ(STATUS_NO_ERROR, this->mClient->init());
    ASSERT_EQ(STATUS_NO_ERROR, this->mClient->init());
    EXPECT_EQ(2u, service->links().size());
    EXPECT_EQ(STATUS_NO_ERROR, this->mClient->deinit());
    EXPECT_EQ(1u, service->links().size());
    service->die();
    EXPECT_EQ(1, this->mTold.deaths);
}

// The reason that there are watchable ones.
TYPED_TEST(WatchableService, IsNeededByAClientThatWatches) {
    this->mServices->add(TypeParam::kName, new TypeParam);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, this->mClient->init());
}

struct NotedDeath : IBinder::DeathRecipient {
    void binderDied(const wp<IBinder>& who) override { died = who; }
    wp<IBinder> died;
};

TEST(Watchable, TellsOfItsWatches) {
    const sp<Watchable<android::BBinder>> binder = new Watchable<android::BBinder>;
    const sp<NotedDeath> first = new NotedDeath;
    const sp<NotedDeath> second = new NotedDeath;
    int cookie = 0;
    wp<IBinder::DeathRecipient> ended;
    EXPECT_EQ(android::OK, binder->pingBinder());
    EXPECT_EQ(android::OK, binder->linkToDeath(first, &cookie, 3));
    EXPECT_EQ(android::OK, binder->linkToDeath(second));
    EXPECT_EQ(android::OK, binder->linkToDeath(new NotedDeath));  // gone at once, and not told
    const auto links = binder->links();
    ASSERT_EQ(3u, links.size());
    EXPECT_EQ(sp<IBinder::DeathRecipient>(first), links[0].recipient.promote());
    EXPECT_EQ(&cookie, links[0].cookie);
    EXPECT_EQ(3u, links[0].flags);

    EXPECT_EQ(android::OK, binder->unlinkToDeath(nullptr, &cookie, 0, &ended));
    EXPECT_EQ(sp<IBinder::DeathRecipient>(first), ended.promote());
    EXPECT_EQ(android::NAME_NOT_FOUND, binder->unlinkToDeath(first));

    binder->die();
    EXPECT_EQ(nullptr, first->died.promote());
    EXPECT_EQ(sp<IBinder>(binder), second->died.promote());
    EXPECT_EQ(0u, binder->links().size());
    EXPECT_EQ(android::DEAD_OBJECT, binder->linkToDeath(first));
    EXPECT_EQ(android::DEAD_OBJECT, binder->unlinkToDeath(second));
}

}  // namespace
}  // namespace pemaro::test
