// SPDX-License-Identifier: Apache-2.0
// What a companion answers that overrides nothing, and what becomes of one that may not be registered; the
// tests over the driver run services that may.

#include "pemaro/BasicTouchCompanionService.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>

#include "pemaro/Serve.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "pemaro/testkit/NativeBinder.h"

namespace pemaro::test {

using android::sp;

TEST(BasicTouchCompanionService, OffersNothing) {
    const sp<BasicTouchCompanionService> held = new BasicTouchCompanionService;
    BasicTouchCompanionService& service = *held;
    SerializableMap map;
    SerializableMapArray array;
    unsigned int value = 0;
    int session = 0;
    const struct {
        const char* operation;
        std::function<int()> call;
    } rows[] = {
            {"prepareRecord", [&] { return service.prepareRecord(); }},
            {"startRecord", [&] { return service.startRecord(); }},
            {"stopRecord", [&] { return service.stopRecord(); }},
            {"setRecordParameter", [&] { return service.setRecordParameter(1); }},
            {"setRecordFile", [&] { return service.setRecordFile("/f"); }},
            {"sendEvent", [&] { return service.sendEvent(1, 2); }},
            {"reloadConfig", [&] { return service.reloadConfig(nullptr); }},
            {"saveConfig", [&] { return service.saveConfig(nullptr); }},
            {"getConfigParams", [&] { return service.getConfigParams(map); }},
            {"setConfigParams", [&] { return service.setConfigParams("a", 1); }},
            {"getProperties", [&] { return service.getProperties(map); }},
            {"sendCommand", [&] { return service.sendCommand(map, map); }},
            {"setAFEParams", [&] { return service.setAFEParams(map); }},
            {"getAFEParams(map)", [&] { return service.getAFEParams(map); }},
            {"getAFEParams(array)", [&] { return service.getAFEParams(array); }},
            {"getPacketSize", [&] { return service.getPacketSize(); }},
            {"inspect", [&] { return service.inspect(&value); }},
            {"saveSession", [&] { return service.saveSession(session); }},
            {"restoreSession", [&] { return service.restoreSession(1); }},
            {"setAuth", [&] { return service.setAuth("a"); }},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(STATUS_UNSUPPORTED, row.call()) << row.operation;
    }
    EXPECT_EQ(nullptr, service.getCblk());
    EXPECT_EQ(0u, service.getConfigParams(nullptr, 0));
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
    EXPECT_EQ(STATUS_NO_ERROR, service->unregisterClient());
    EXPECT_EQ(STATUS_NO_ERROR, service->close());
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
