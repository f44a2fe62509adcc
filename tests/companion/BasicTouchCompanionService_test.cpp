// SPDX-License-Identifier: Apache-2.0
// What a companion answers that overrides nothing, and what becomes of one that may not be registered; the
// tests over the driver run services that may.

#include "pemaro/BasicTouchCompanionService.h"

#include <gtest/gtest.h>

#include <string>

#include "pemaro/BpTouchCompanionService.h"
#include "pemaro/Serve.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "pemaro/testkit/NativeBinder.h"

namespace pemaro::test {

using android::sp;

TEST(BasicTouchCompanionService, OffersNothing) {
    const sp<BasicTouchCompanionService> service = new BasicTouchCompanionService;
    SerializableMap map;
    SerializableMapArray array;
    unsigned int value = 0;
    int session = 0;
    EXPECT_EQ(STATUS_UNSUPPORTED, service->prepareRecord());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->startRecord());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->stopRecord());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->setRecordParameter(1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->setRecordFile("/f"));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->sendEvent(1, 2));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->reloadConfig(nullptr));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->saveConfig(nullptr));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getConfigParams(map));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->setConfigParams("a", 1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getProperties(map));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->sendCommand(map, map));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->setAFEParams(map));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getAFEParams(map));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getAFEParams(array));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getPacketSize());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->inspect(&value));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->saveSession(session));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->restoreSession(1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->setAuth("a"));
    EXPECT_EQ(nullptr, service->getCblk());
    EXPECT_EQ(0u, service->getConfigParams(nullptr, 0));
}

TEST(BasicTouchCompanionService, LetsAClientConnect) {
    ScopedServiceManager services;
    const sp<BasicTouchCompanionService> service = new BasicTouchCompanionService;
    services->add("pemaro.TouchService", service);
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    ASSERT_EQ(STATUS_NO_ERROR, client->init());
    EXPECT_EQ(STATUS_UNSUPPORTED, client->setAuth("a"));
    EXPECT_EQ(STATUS_UNSUPPORTED, client->getPacketSize());
    EXPECT_EQ(STATUS_UNSUPPORTED, client->setRecordOutput(1));
}

TEST(BasicTouchCompanionService, LetsEverybodyComeAndGo) {
    const sp<BasicTouchCompanionService> service = new BasicTouchCompanionService;
    EXPECT_EQ(STATUS_NO_ERROR, service->registerClient(nullptr));
    EXPECT_EQ(STATUS_NO_ERROR, service->open());
    EXPECT_EQ(STATUS_NO_ERROR, service->close());
    EXPECT_EQ(STATUS_NO_ERROR, service->unregisterClient());
}

namespace {

// A service as another process sees it: there is no calling it but by transactions.
class Remote : public android::BBinder {
  public:
    explicit Remote(const sp<android::IBinder>& service) : mService(service) {}

  private:
    android::status_t onTransact(uint32_t code, const android::Parcel& data, android::Parcel* reply,
                                 uint32_t flags) override {
        return mService->transact(code, data, reply, flags);
    }

    const sp<android::IBinder> mService;
};

}  // namespace

TEST(BasicTouchCompanionService, KeepsWhatItAnswersToPreparationsFromClients) {
    struct Unprepared : BasicTouchCompanionService {
        int setRecordParameter(int) override { return STATUS_NO_ERROR; }
    };
    const sp<android::IBinder> service = new Remote(new Unprepared);
    const sp<ITouchCompanionService> proxy = new BpTouchCompanionService(service);
    EXPECT_EQ(STATUS_NO_ERROR, proxy->prepareRecord());
    ScopedServiceManager services;
    services->add("pemaro.TouchService", service);
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    ASSERT_EQ(STATUS_NO_ERROR, client->init());
    ASSERT_EQ(STATUS_NO_ERROR, client->setRecordOutput(1));
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord());
}

namespace {

// A service manager that lets nobody in.
class StrictServiceManager : public FakeServiceManager {
  public:
    android::status_t addService(const android::String16& name, const sp<android::IBinder>&, bool,
                                 int) override {
        asked += android::String8(name).c_str();
        return android::PERMISSION_DENIED;
    }
    std::string asked;
};

}  // namespace

TEST(Serve, ReturnsWhenTheServiceManagerRefuses) {
    const ScopedServiceManager services;
    const sp<StrictServiceManager> strict = new StrictServiceManager;
    useServiceManager(strict);
    EXPECT_EQ(android::PERMISSION_DENIED, publish(new BasicTouchCompanionService));
    EXPECT_EQ("pemaro.TouchService", strict->asked);
    EXPECT_EQ(android::PERMISSION_DENIED, serve(new BasicTouchCompanionService));
}

}  // namespace pemaro::test
