// SPDX-License-Identifier: Apache-2.0
// A gesture manager: it reports a gesture ten times a second while it is to look for them, and keeps
// what the user draws. docs/service-tutorial.md tells how it comes about.
//
//     gesture_service          until it is killed; needs the Binder driver and a service manager

// Ours come first: the platform's headers use standard ones without including them.
#include "pemaro/BnGestureManagerService.h"
#include "pemaro/Status.h"

#include <binder/IPCThreadState.h>
#include <binder/IServiceManager.h>
#include <binder/ProcessState.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <mutex>
#include <set>
#include <thread>
#include <vector>

namespace {

using namespace pemaro;
using android::sp;
using Client = IGestureManagerClient;

class GestureService : public BnGestureManagerService {
  public:
    int subscribe(const sp<Client>& client) override {
        const std::lock_guard<std::mutex> guard(mLock);
        mClients.push_back(client);
        return STATUS_NO_ERROR;
    }
    int unsubscribe(const sp<Client>& client) override {
        remove(client);
        return STATUS_NO_ERROR;
    }
    int enableWakeup() override { return STATUS_NO_ERROR; }
    int disableWakeup() override { return STATUS_NO_ERROR; }
    int startGestureDetection() override { return detect(true); }
    int stopGestureDetection() override { return detect(false); }
    int addGesture(int count, Client::GestureData* samples, int& result) override {
        const std::lock_guard<std::mutex> guard(mLock);
        if (count <= 0 || samples == nullptr) return STATUS_BAD_PARAMETER;
        mGestures.insert(result = ++mLastGesture);
        return STATUS_NO_ERROR;
    }
    int deleteGesture(int gesture) override {
        const std::lock_guard<std::mutex> guard(mLock);
        return mGestures.erase(gesture) == 1 ? STATUS_NO_ERROR : STATUS_BAD_PARAMETER;
    }
    int enableGesture(int) override { return STATUS_UNSUPPORTED; }
    int disableGesture(int) override { return STATUS_UNSUPPORTED; }
    int improveGestureTraining(Client::GestureData*, int&) override { return STATUS_UNSUPPORTED; }
    int getMaxPreDefinedGesture(unsigned int& count) override {
        count = 1;
        return STATUS_NO_ERROR;
    }
    int getMaxUserDefinedGesture(unsigned int& count) override {
        count = 100;
        return STATUS_NO_ERROR;
    }

    // No lock is held while a client is called, which may take its time, or call back.
    [[noreturn]] void report() {
        static Client::GestureData gesture = {};
        for (;; std::this_thread::sleep_for(std::chrono::milliseconds(100))) {
            gesture.bytes[0] += 1;
            for (const sp<Client>& client : mDetecting ? clients() : std::vector<sp<Client>>()) {
                if (client->gestureCallback(&gesture) != STATUS_NO_ERROR) remove(client);
            }
        }
    }

  private:
    std::vector<sp<Client>> clients() {
        const std::lock_guard<std::mutex> guard(mLock);
        return mClients;
    }
    // A client comes as another proxy each time, around the same binder.
    void remove(const sp<Client>& client) {
        const std::lock_guard<std::mutex> guard(mLock);
        const auto same = [&](const sp<Client>& other) {
            return Client::asBinder(other) == Client::asBinder(client);
        };
        mClients.erase(std::remove_if(mClients.begin(), mClients.end(), same), mClients.end());
    }
    int detect(bool on) {
        mDetecting = on;
        return STATUS_NO_ERROR;
    }

    std::mutex mLock;  // operations come on several of Binder's threads
    std::vector<sp<Client>> mClients;
    std::set<int> mGestures;
    int mLastGesture = 0;
    std::atomic<bool> mDetecting{false};
};

}  // namespace

int main() {
    const sp<GestureService> service = new GestureService;
    android::ProcessState::self()->startThreadPool();
    android::defaultServiceManager()->addService(android::String16("pemaro.GestureManagerService"),
                                                 service);
    service->report();
}
