// SPDX-License-Identifier: Apache-2.0
#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>
#include <gtest/gtest.h>

#include <memory>

#include "tests/driver/DriverSetting.h"
#include "tests/driver/FaultyServices.h"
#include "tests/faults/Operations.h"
#include "tests/faults/Peer.h"

namespace pemaro::test {

namespace {

using android::sp;

class DriverPeer : public Peer {
  public:
    void start() override {
        const sp<android::IBinder> service = binder(kServices[0]);
        if (service != nullptr && service->pingBinder() == android::NO_ERROR) {
            order({});
            return;
        }
        mProcess = std::make_unique<ChildProcess>(
                std::vector<std::string>{test::binary("faulty-services")});
        EXPECT_TRUE(mProcess->awaitOutput("process ")) << mProcess->errors();
    }

    void order(const Order& order) override {
        android::Parcel data;
        android::Parcel reply;
        writeOrder(data, order);
        EXPECT_EQ(android::NO_ERROR,
                  binder(kServices[0])->transact(kOrderTransaction, data, &reply));
    }

    sp<android::IBinder> binder(const std::string& service) override {
        return android::defaultServiceManager()->checkService(android::String16(service.c_str()));
    }

  private:
    std::unique_ptr<ChildProcess> mProcess;
};

}  // namespace

Peer& Peer::instance() {
    static DriverPeer peer;
    return peer;
}

}  // namespace pemaro::test
