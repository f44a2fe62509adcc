// SPDX-License-Identifier: Apache-2.0
#include "pemaro/RingRecorder.h"

#include <gtest/gtest.h>

#include <atomic>
#include <future>
#include <memory>
#include <thread>

#include "binder/PlatformShims.h"
#include "tests/support/NoThreads.h"

namespace pemaro::test {

namespace {

TouchCompanionSharedCblk* blockOf(const android::sp<android::IMemory>& memory) {
    return static_cast<TouchCompanionSharedCblk*>(mappedAddress(memory));
}

void awaitFrames(const android::sp<android::IMemory>& memory, uint32_t count) {
    while (TouchCompanionSharedCblk::acquireIndex(blockOf(memory)->write) < count) {
        std::this_thread::yield();
    }
}

// Tells when the last of its copies is gone, and with it the thread that uses it.
struct Token {
    explicit Token(std::promise<void>& gone) : mGone(gone) {}
    ~Token() { mGone.set_value(); }
    std::promise<void>& mGone;
};

}  // namespace

TEST(RingRecorder, WritesUntilItIsStopped) {
    RingRecorder recorder;
    EXPECT_EQ(nullptr, recorder.memory());
    ASSERT_EQ(STATUS_NO_ERROR, recorder.prepare(16, 4));
    const android::sp<android::IMemory> memory = recorder.memory();
    EXPECT_EQ(4u, blockOf(memory)->bufferFrames);
    EXPECT_EQ(16u, blockOf(memory)->frameSize);

    std::promise<void> gone;
    ASSERT_EQ(STATUS_NO_ERROR, recorder.start([token = std::make_shared<Token>(gone)](
                                                      RingWriter& ring) { ring.put("frame", 6); }));
    awaitFrames(memory, 4);
    EXPECT_STREQ("frame", reinterpret_cast<const char*>(blockOf(memory)->frames()));
    EXPECT_EQ(STATUS_NO_ERROR, recorder.stop());
    gone.get_future().wait();
    EXPECT_EQ(nullptr, recorder.memory());
    EXPECT_EQ(STATUS_NO_ERROR, recorder.stop()) << "there is nothing to stop";
}

TEST(RingRecorder, StartsWhatIsPreparedAndOnce) {
    RingRecorder recorder;
    const auto nothing = [](RingWriter&) { std::this_thread::yield(); };
    EXPECT_EQ(STATUS_INVALID_STATE, recorder.start(nothing));
    ASSERT_EQ(STATUS_NO_ERROR, recorder.prepare(16, 4));
    EXPECT_EQ(STATUS_NO_ERROR, recorder.start(nothing));
    EXPECT_EQ(STATUS_INVALID_STATE, recorder.start(nothing));
    EXPECT_EQ(STATUS_NO_ERROR, recorder.stop());
    EXPECT_EQ(STATUS_INVALID_STATE, recorder.start(nothing));
}

TEST(RingRecorder, MakesANewRingForEachRecording) {
    RingRecorder recorder;
    ASSERT_EQ(STATUS_NO_ERROR, recorder.prepare(16, 4));
    const android::sp<android::IMemory> first = recorder.memory();
    std::promise<void> gone;
    recorder.start([token = std::make_shared<Token>(gone)](RingWriter& ring) { ring.put("a", 2); });
    awaitFrames(first, 4);
    ASSERT_EQ(STATUS_NO_ERROR, recorder.prepare(32, 8));
    // What a client that died had left running has ended.
    gone.get_future().wait();
    EXPECT_NE(first, recorder.memory());
    EXPECT_EQ(0u, blockOf(recorder.memory())->write);
    EXPECT_EQ(4u, blockOf(first)->write);
}

TEST(RingRecorder, TellsThatThereIsNoMemory) {
    RingRecorder recorder;
    ASSERT_EQ(STATUS_NO_ERROR, recorder.prepare(16, 4));
    EXPECT_EQ(STATUS_ERROR_ALLOCATING_MEMORY, recorder.prepare(UINT32_MAX, UINT32_MAX));
    EXPECT_EQ(nullptr, recorder.memory());
}

// As a signal that a dead client keeps from returning.
TEST(RingRecorder, WaitsForNoThread) {
    std::promise<void> inside;
    std::promise<void> release;
    std::promise<void> gone;
    {
        RingRecorder recorder;
        ASSERT_EQ(STATUS_NO_ERROR, recorder.prepare(16, 4));
        ASSERT_EQ(STATUS_NO_ERROR,
                  recorder.start([&, token = std::make_shared<Token>(gone)](RingWriter& ring) {
                      inside.set_value();
                      release.get_future().wait();
                      ring.put("late", 5);
                  }));
        inside.get_future().wait();
        EXPECT_EQ(STATUS_NO_ERROR, recorder.stop());
        EXPECT_EQ(STATUS_NO_ERROR, recorder.prepare(16, 4));
    }
    release.set_value();
    gone.get_future().wait();
}

TEST(RingRecorder, RefusesAnEmptyFunction) {
    RingRecorder recorder;
    ASSERT_EQ(STATUS_NO_ERROR, recorder.prepare(16, 4));
    EXPECT_EQ(STATUS_BAD_PARAMETER, recorder.start(nullptr));
    EXPECT_EQ(STATUS_NO_ERROR, recorder.start([](RingWriter&) { std::this_thread::yield(); }));
}

#ifdef __GLIBC__
// Asks the recorder when the function that captured it is destroyed.
struct Asking {
    explicit Asking(RingRecorder& recorder) : mRecorder(recorder) {}
    ~Asking() { static_cast<void>(mRecorder.memory()); }
    RingRecorder& mRecorder;
};

TEST(RingRecorder, HoldsNoLockWhenThereIsNoThread) {
    RingRecorder recorder;
    ASSERT_EQ(STATUS_NO_ERROR, recorder.prepare(16, 4));
    {
        const NoThreads none;
        EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE,
                  recorder.start([asking = std::make_shared<Asking>(recorder)](RingWriter&) {}));
    }
    EXPECT_EQ(STATUS_NO_ERROR, recorder.start([](RingWriter&) { std::this_thread::yield(); }))
            << "it is prepared still";
}
#endif

}  // namespace pemaro::test
