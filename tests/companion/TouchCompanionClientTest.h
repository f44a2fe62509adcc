// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <thread>
#include <vector>

#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "pemaro/testkit/FakeTouchCompanionService.h"
#include "tests/companion/CompanionInterface.h"
#include "tests/support/FakeWaits.h"
#include "tests/support/LocalMemory.h"
#include "tests/support/LogLines.h"

namespace pemaro::test {

constexpr char kClientTag[] = "TouchCompanionClient";

// Of the rings that the tests make.
constexpr uint32_t kFrameSize = 64;
constexpr uint32_t kBufferFrames = 8;

/// How long a test waits for what should happen at once before it gives up.
constexpr std::chrono::seconds kPatience{60};

/// A client and a service in one process.
class TouchCompanionClientTest : public ::testing::Test {
  protected:
    void SetUp() override {
        mServices->add(kDescriptor, mService);
        clearLog();
    }

    /// A client after a successful init(), with the calls and lines of that forgotten.
    android::sp<TouchCompanionClient> connect(TouchCompanionClient::DataCallback callback = nullptr,
                                              void* context = nullptr) {
        android::sp<TouchCompanionClient> client = new TouchCompanionClient(callback, context);
        EXPECT_EQ(0, client->init());
        forget();
        return client;
    }

    /// A client that records to `ring`, likewise.
    android::sp<TouchCompanionClient> record(const FrameRing& ring,
                                             TouchCompanionClient::DataCallback callback = nullptr,
                                             void* context = nullptr) {
        mService->cblk = ring.memory();
        android::sp<TouchCompanionClient> client = connect(callback, context);
        EXPECT_EQ(0, client->setRecordOutput(1));
        EXPECT_EQ(0, client->startRecord());
        forget();
        return client;
    }

    void forget() {
        mService->clearCalls();
        clearLog();
    }

    static Lines clientLines() { return linesOf(kClientTag); }

    ScopedServiceManager mServices;
    const android::sp<FakeTouchCompanionService> mService = new FakeTouchCompanionService;
};

/// Keeps what a data callback was given: `new TouchCompanionClient(Frames::callback, &frames)`.
class Frames {
  public:
    struct Frame {
        int zero;
        void* data;
        unsigned long length;
        std::thread::id thread;
    };

    static void callback(int zero, void* data, unsigned long length, void* context) {
        static_cast<Frames*>(context)->add({zero, data, length, std::this_thread::get_id()});
    }

    size_t count() const {
        std::lock_guard<std::mutex> lock(mLock);
        return mFrames.size();
    }

    Frame operator[](size_t index) const {
        std::lock_guard<std::mutex> lock(mLock);
        return mFrames.at(index);
    }

    /// Whether there were `count` frames within the patience of a test.
    bool waitFor(size_t count) {
        std::unique_lock<std::mutex> lock(mLock);
        return mArrived.wait_for(lock, kPatience, [&] { return mFrames.size() >= count; });
    }

  private:
    void add(const Frame& frame) {
        std::lock_guard<std::mutex> lock(mLock);
        mFrames.push_back(frame);
        mArrived.notify_all();
    }

    mutable std::mutex mLock;
    std::condition_variable mArrived;
    std::vector<Frame> mFrames;
};

}  // namespace pemaro::test
