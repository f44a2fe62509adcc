// SPDX-License-Identifier: Apache-2.0
#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>
#include <gtest/gtest.h>
#include <time.h>
#include <unistd.h>
#include <utils/SystemClock.h>
#include <utils/Timers.h>

#include <algorithm>
#include <memory>

#include "tests/driver/DriverSetting.h"
#include "tests/driver/FaultyServices.h"
#include "tests/faults/Operations.h"
#include "tests/faults/Peer.h"
#include "tests/support/FakeWaits.h"

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

    bool awaitStalled() override {
        for (int i = 0; i < 10000; ++i) {
            android::Parcel data;
            android::Parcel reply;
            binder(kServices[0])->transact(kStalledTransaction, data, &reply);
            if (reply.readInt32() != 0) {
                return true;
            }
            usleep(1000);
        }
        return false;
    }

    void kill() override {
        mProcess.reset();
        for (const char* name : kServices) {
            while (binder(name) != nullptr) {
                usleep(1000);
            }
        }
    }

    sp<android::IBinder> binder(const std::string& service) override {
        return android::defaultServiceManager()->checkService(android::String16(service.c_str()));
    }

  private:
    FakeWaits mWaits;
    std::unique_ptr<ChildProcess> mProcess;
};

}  // namespace

Peer& Peer::instance() {
    static DriverPeer peer;
    return peer;
}

}  // namespace pemaro::test

// In place of libutils' and the C library's: where a service is absent, the platform looks for it for five
// seconds, with a second's sleep between, and some clients have it look ten times.
int64_t android::uptimeMillis() {
    return systemTime(SYSTEM_TIME_MONOTONIC) / 10000;  // a hundred times as fast
}

extern "C" int usleep(useconds_t micros) {
    const timespec time = {0, std::min<long>(micros, 10000) * 1000};
    return nanosleep(&time, nullptr);
}
