// SPDX-License-Identifier: Apache-2.0
#include <unistd.h>

#include <map>

#include "pemaro/testkit/FakeServiceManager.h"
#include "tests/faults/Operations.h"
#include "tests/faults/Peer.h"
#include "tests/support/FakeWaits.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {

namespace {

using android::Parcel;
using android::sp;

class NativePeer : public Peer {
  public:
    void start() override {
        for (const char* name : kServices) {
            sp<RecordingBinder>& binder = mBinders[name];
            if (binder == nullptr || !binder->isBinderAlive()) {
                binder = new RecordingBinder;
                mServices->add(name, binder);
            }
        }
        order({});
    }

    void order(const Order& order) override {
        for (const auto& entry : mBinders) {
            const sp<RecordingBinder> binder = entry.second;
            binder->handle([this, order](uint32_t code, const Parcel&, Parcel* reply) {
                if (order.deadly == Order::kAnyCall || order.deadly == code) {
                    die();
                    return android::status_t{android::DEAD_OBJECT};
                }
                usleep(static_cast<useconds_t>(order.delayMillis) * 1000);
                return reply->setData(order.reply.data(), order.reply.size());
            });
        }
    }

    sp<android::IBinder> binder(const std::string& service) override {
        const auto found = mBinders.find(service);
        return found == mBinders.end() ? nullptr : found->second;
    }

  private:
    void die() {
        for (const auto& entry : mBinders) {
            entry.second->die();
        }
    }

    ScopedServiceManager mServices;
    FakeWaits mWaits;
    std::map<std::string, sp<RecordingBinder>> mBinders;
};

}  // namespace

Peer& Peer::instance() {
    static NativePeer peer;
    return peer;
}

}  // namespace pemaro::test
