// SPDX-License-Identifier: Apache-2.0
#include <unistd.h>

#include <map>

#include "pemaro/testkit/FakeServiceManager.h"
#include "tests/faults/Operations.h"
#include "tests/faults/OrderedAnswers.h"
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
                binder->handle([this](uint32_t code, const Parcel&, Parcel* reply) {
                    if (mAnswers.answer(code, reply)) {
                        return android::status_t{android::NO_ERROR};
                    }
                    die();
                    return android::status_t{android::DEAD_OBJECT};
                });
                mServices->add(name, binder);
            }
        }
        order({});
    }

    void order(const Order& order) override { mAnswers.order(order); }

    bool awaitStalled() override {
        for (int i = 0; mAnswers.stalled() == 0 && i < 10000; ++i) {
            usleep(1000);
        }
        return mAnswers.stalled() != 0;
    }

    void kill() override {
        die();
        for (const char* name : kServices) {
            mServices->remove(name);
        }
        mBinders.clear();
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
    OrderedAnswers mAnswers;
    std::map<std::string, sp<RecordingBinder>> mBinders;
};

}  // namespace

Peer& Peer::instance() {
    static NativePeer peer;
    return peer;
}

}  // namespace pemaro::test
