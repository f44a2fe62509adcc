// SPDX-License-Identifier: Apache-2.0
// A gesture manager: it reports a gesture ten times a second while it is to look for them, and keeps
// what the user draws. docs/service-tutorial.md tells how it comes about.
//
//     gesture_service          until it is killed; needs the Binder driver and a service manager

#include <atomic>
#include <chrono>
#include <cstdlib>
#include <mutex>
#include <set>
#include <thread>

#include "pemaro/BasicGestureManagerService.h"
#include "pemaro/Serve.h"
#include "pemaro/Status.h"

namespace {

using namespace pemaro;
using Gesture = IGestureManagerClient::GestureData;

class GestureService : public BasicGestureManagerService {
  public:
    int startGestureDetection() override { return detect(true); }
    int stopGestureDetection() override { return detect(false); }
    int addGesture(int count, Gesture* samples, int& result) override {
        result = 0;
        if (count <= 0 || samples == nullptr) return STATUS_BAD_PARAMETER;
        const std::lock_guard<std::mutex> guard(mLock);
        mGestures.insert(result = ++mLastGesture);
        return STATUS_NO_ERROR;
    }
    int deleteGesture(int gesture) override {
        const std::lock_guard<std::mutex> guard(mLock);
        return mGestures.erase(gesture) == 1 ? STATUS_NO_ERROR : STATUS_BAD_PARAMETER;
    }
    int getMaxPreDefinedGesture(unsigned int& count) override {
        count = 1;
        return STATUS_NO_ERROR;
    }
    int getMaxUserDefinedGesture(unsigned int& count) override {
        count = 100;
        return STATUS_NO_ERROR;
    }

    [[noreturn]] void work() {
        static Gesture gesture = {};
        for (;; std::this_thread::sleep_for(std::chrono::milliseconds(100))) {
            gesture.bytes[0] += 1;
            if (mDetecting) report(gesture);
        }
    }

  private:
    int detect(bool on) {
        mDetecting = on;
        return STATUS_NO_ERROR;
    }

    std::mutex mLock;  // operations come on several of Binder's threads
    std::set<int> mGestures;
    int mLastGesture = 0;
    std::atomic<bool> mDetecting{false};
};

}  // namespace

int main() {
    const android::sp<GestureService> service = new GestureService;
    if (publish(service) != android::OK) return EXIT_FAILURE;
    service->work();
}
