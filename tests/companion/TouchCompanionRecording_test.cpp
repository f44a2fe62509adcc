// SPDX-License-Identifier: Apache-2.0
// Recording: the choice of the output, starting and stopping, and the delivery of frames.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>

#include "tests/companion/TouchCompanionClientTest.h"
#include "tests/support/FakeClock.h"
#include "tests/support/NoThreads.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::sp;
using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::Not;

constexpr nsecs_t kSecond = 1000000000;

class TouchCompanionRecording : public TouchCompanionClientTest {
  protected:
    FrameRing mRing{kBufferFrames, kFrameSize};
    FakeWaits mWaits;
    Frames mFrames;
};

// ---- the output ----

TEST_F(TouchCompanionRecording, TellsTheServiceTheOutput) {
    const sp<TouchCompanionClient> client = connect();
    EXPECT_EQ(0, client->setRecordOutput(0));
    EXPECT_EQ(0, client->setRecordOutput(1));
    EXPECT_EQ(0, client->setRecordOutput(-7));
    EXPECT_THAT(mService->calls(), ElementsAre("setRecordParameter(0)", "setRecordParameter(1)",
                                               "setRecordParameter(-7)"));
    EXPECT_THAT(clientLines(), IsEmpty());
}

TEST_F(TouchCompanionRecording, KeepsAnOutputThatTheServiceRefuses) {
    const sp<TouchCompanionClient> client = connect();
    mService->setStatus("setRecordParameter", STATUS_BAD_PARAMETER);
    EXPECT_EQ(STATUS_BAD_PARAMETER, client->setRecordOutput(0));
    EXPECT_THAT(clientLines(), ElementsAre("E output parameter(0) is wrong"));
    EXPECT_EQ(0, client->setRecordFile("/f")) << "the output is stored before the service is asked";
}

TEST_F(TouchCompanionRecording, NamesTheFileOfTheFileOutput) {
    const sp<TouchCompanionClient> client = connect();
    EXPECT_EQ(0, client->setRecordOutput(0));
    EXPECT_EQ(0, client->setRecordFile("/data/frames.bin"));
    EXPECT_THAT(mService->calls(),
                ElementsAre("setRecordParameter(0)", "setRecordFile(/data/frames.bin)"));
    EXPECT_THAT(clientLines(), IsEmpty());
}

TEST_F(TouchCompanionRecording, RefusesAFileForAnyOtherOutput) {
    const sp<TouchCompanionClient> client = connect();
    EXPECT_EQ(STATUS_BAD_PARAMETER, client->setRecordFile("/f")) << "no output was chosen";
    client->setRecordOutput(1);
    EXPECT_EQ(STATUS_BAD_PARAMETER, client->setRecordFile("/f"));
    EXPECT_THAT(mService->calls(), ElementsAre("setRecordParameter(1)"));
    const std::string line = "E setRecordFile can be called only with OUTPUT_FILE option";
    EXPECT_THAT(clientLines(), ElementsAre(line, line));
}

TEST_F(TouchCompanionRecording, PassesARefusedFileOn) {
    const sp<TouchCompanionClient> client = connect();
    client->setRecordOutput(0);
    mService->setStatus("setRecordFile", STATUS_INVALID_FILE_PATH);
    EXPECT_EQ(STATUS_INVALID_FILE_PATH, client->setRecordFile("/f"));
    EXPECT_THAT(clientLines(), ElementsAre("E setDumpFile failed"));
}

TEST_F(TouchCompanionRecording, ReadsNothing) {
    const sp<TouchCompanionClient> client = connect();
    char buffer[4] = "abc";
    EXPECT_EQ(0, client->read(buffer, sizeof(buffer)));
    EXPECT_STREQ("abc", buffer);
    EXPECT_THAT(mService->calls(), IsEmpty());
}

// ---- starting ----

TEST_F(TouchCompanionRecording, DoesNotStartBeforeAnOutputIsChosen) {
    const sp<TouchCompanionClient> client = connect();
    EXPECT_EQ(STATUS_BAD_PARAMETER, client->startRecord());
    EXPECT_THAT(mService->calls(), IsEmpty());
    EXPECT_THAT(clientLines(), ElementsAre("E recording parameter is wrong(-1)"));
}

TEST_F(TouchCompanionRecording, StartsToAFileWithoutBlockOrThread) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    client->setRecordOutput(0);
    mService->clearCalls();
    EXPECT_EQ(0, client->startRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "startRecord"));
    EXPECT_THAT(clientLines(), IsEmpty());
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "startRecord", "stopRecord"));
}

TEST_F(TouchCompanionRecording, MapsTheBlockForSharedMemory) {
    const sp<TouchCompanionClient> client = connect();
    mService->cblk = mRing.memory();
    mRing.cblk().data = nullptr;
    client->setRecordOutput(1);
    forget();
    EXPECT_EQ(0, client->startRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "getCblk", "startRecord"));
    EXPECT_EQ(mRing.memory()->bytes() + 136, mRing.cblk().data);
    EXPECT_THAT(clientLines(), IsEmpty()) << "no callback, no thread";
}

TEST_F(TouchCompanionRecording, DeliversNothingWithoutACallback) {
    const sp<TouchCompanionClient> client = record(mRing);
    mRing.put();
    usleep(20000);
    EXPECT_EQ(0u, mRing.cblk().read);
}

TEST_F(TouchCompanionRecording, DeliversBeforeTheServiceIsToldToStart) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    mService->cblk = mRing.memory();
    client->setRecordOutput(1);
    forget();
    mService->onCall([&](const std::string& call) {
        if (call == "startRecord") {
            mRing.put();
            EXPECT_TRUE(mFrames.waitFor(1));
        }
    });
    EXPECT_EQ(0, client->startRecord());
    EXPECT_THAT(clientLines(), Contains("D Init: callback is set, create DebugThread"));
    EXPECT_EQ(0, client->stopRecord());
}

TEST_F(TouchCompanionRecording, PassesARefusedPreparationOn) {
    const sp<TouchCompanionClient> client = connect();
    client->setRecordOutput(1);
    forget();
    mService->setStatus("prepareRecord", STATUS_INVALID_STATE);
    EXPECT_EQ(STATUS_INVALID_STATE, client->startRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord"));
    EXPECT_THAT(clientLines(), ElementsAre("E fail to prepare recording"));
}

TEST_F(TouchCompanionRecording, FailsWithoutABlock) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    client->setRecordOutput(1);
    forget();
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "getCblk"));
    EXPECT_THAT(clientLines(), ElementsAre("E couldn't get shared control block"));
}

TEST_F(TouchCompanionRecording, FailsWhenTheBlockCannotBeMapped) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    client->setRecordOutput(1);
    forget();
    mService->cblk = LocalMemory::unmapped();
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "getCblk"));
    EXPECT_THAT(clientLines(), IsEmpty());
}

TEST_F(TouchCompanionRecording, FailsWhenTheBinderIsNoMemory) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    client->setRecordOutput(1);
    forget();
    const sp<RecordingBinder> other = new RecordingBinder;
    mService->cblk = android::IMemory::asInterface(other);
    for (const Bytes& garbage : {Bytes{}, Bytes{1, 2, 3}, Bytes(64, 0xff)}) {
        other->answer(
                [&](android::Parcel& reply) { reply.setData(garbage.data(), garbage.size()); });
        EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord());
    }
    EXPECT_THAT(mService->calls(), Not(Contains("startRecord")));
}

TEST_F(TouchCompanionRecording, FailsWhenTheMemoryIsTooSmallForABlock) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    client->setRecordOutput(1);
    forget();
    for (size_t size : {0, 1, 104, 135}) {
        mService->cblk = new LocalMemory(size);
        EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord()) << size;
    }
    EXPECT_THAT(clientLines(), IsEmpty());
    EXPECT_THAT(mService->calls(), Not(Contains("startRecord")));
}

// The client writes its own address into the block.
TEST_F(TouchCompanionRecording, RefusesABlockThatItCannotWriteTo) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    client->setRecordOutput(1);
    forget();
    mService->cblk = LocalMemory::readOnly(1000);
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "getCblk"));
    EXPECT_THAT(clientLines(),
                ElementsAre("E shared control block cannot be used: it is mapped read-only"));
}

TEST_F(TouchCompanionRecording, RefusesABlockThatTheConditionCannotWorkIn) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    client->setRecordOutput(1);
    for (size_t offset : {1, 2, 4, 7}) {
        forget();
        const sp<LocalMemory> memory = LocalMemory::atOffset(offset, 1000);
        mService->cblk = memory;
        EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord()) << offset;
        EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "getCblk"));
        EXPECT_THAT(clientLines(),
                    ElementsAre(withAddress("E shared control block cannot be used: %p is not "
                                            "aligned to 8 bytes",
                                            memory->bytes())));
    }
    mService->cblk = LocalMemory::atOffset(8, 1000);
    EXPECT_EQ(0, client->startRecord());
    EXPECT_EQ(0, client->stopRecord());
}

// What was set up before the failure stays: the thread runs until the recording is stopped.
TEST_F(TouchCompanionRecording, PassesARefusedStartOnAndGoesOnDelivering) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    mService->cblk = mRing.memory();
    client->setRecordOutput(1);
    mService->setStatus("startRecord", STATUS_INVALID_STATE);
    EXPECT_EQ(STATUS_INVALID_STATE, client->startRecord());
    EXPECT_THAT(clientLines(), Contains("E startRecord failed"));
    mRing.put();
    EXPECT_TRUE(mFrames.waitFor(1));
    EXPECT_EQ(0, client->stopRecord());
}

TEST_F(TouchCompanionRecording, StartsAgainAfterAStop) {
    const sp<TouchCompanionClient> client = record(mRing, Frames::callback, &mFrames);
    for (size_t round = 1; round <= 20; ++round) {
        mRing.put();
        EXPECT_TRUE(mFrames.waitFor(round));
        EXPECT_EQ(0, client->stopRecord());
        EXPECT_EQ(0, client->startRecord());
    }
    EXPECT_EQ(20u, mFrames.count());
}

// ---- stopping ----

TEST_F(TouchCompanionRecording, StopsAndLetsTheBlockGo) {
    const sp<TouchCompanionClient> client = record(mRing);
    const int32_t references = mRing.memory()->getStrongCount();
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("stopRecord"));
    EXPECT_EQ(references - 1, mRing.memory()->getStrongCount());
    EXPECT_THAT(clientLines(),
                ElementsAre("D stopRecord: E", "D stopRecord: call stopRecord on remote side",
                            "D stopRecord: clear shared memory"));
    TouchCompanionClient::FrameBuffer buffer = {};
    EXPECT_EQ(STATUS_INVALID_STATE, client->acquireBuffer(&buffer));
}

TEST_F(TouchCompanionRecording, KeepsTheBlockWhenTheServiceRefusesToStop) {
    const sp<TouchCompanionClient> client = record(mRing);
    mRing.put();
    const int32_t references = mRing.memory()->getStrongCount();
    mService->setStatus("stopRecord", STATUS_INVALID_STATE);
    EXPECT_EQ(STATUS_INVALID_STATE, client->stopRecord());
    EXPECT_EQ(references, mRing.memory()->getStrongCount());
    EXPECT_EQ("E stopRecord failed", clientLines().back());
    TouchCompanionClient::FrameBuffer buffer = {nullptr, kFrameSize, 0};
    EXPECT_EQ(0, client->acquireBuffer(&buffer));
    EXPECT_EQ(1u, buffer.frameCount);
}

TEST_F(TouchCompanionRecording, StopsWhatNeverStarted) {
    const sp<TouchCompanionClient> client = connect();
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("stopRecord"));
}

TEST_F(TouchCompanionRecording, EndsTheThreadBeforeTheServiceIsToldToStop) {
    const sp<TouchCompanionClient> client = record(mRing, Frames::callback, &mFrames);
    mRing.put();
    EXPECT_TRUE(mFrames.waitFor(1));
    mService->onCall([&](const std::string& call) {
        if (call == "stopRecord") {
            mRing.put();
            usleep(20000);
            EXPECT_EQ(1u, mFrames.count()) << "the thread has ended";
        }
    });
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_EQ(1u, mFrames.count());
}

// ---- a service that died ----

// A wait in the block that does not end, as one whose words a dead writer has left locked.
class StuckWait {
  public:
    explicit StuckWait(FakeWaits& waits) {
        waits.onWait([this](int) {
            std::unique_lock<std::mutex> lock(mLock);
            mEntered = true;
            mChanged.notify_all();
            mChanged.wait(lock, [this] { return mReleased; });
            mLeft = true;
            mChanged.notify_all();
        });
    }

    bool waitUntilEntered() {
        std::unique_lock<std::mutex> lock(mLock);
        return mChanged.wait_for(lock, kPatience, [this] { return mEntered; });
    }

    /// Returns when the thread is out of it.
    bool release() {
        std::unique_lock<std::mutex> lock(mLock);
        mReleased = true;
        mChanged.notify_all();
        return mChanged.wait_for(lock, kPatience, [this] { return mLeft; });
    }

  private:
    std::mutex mLock;
    std::condition_variable mChanged;
    bool mEntered = false;
    bool mReleased = false;
    bool mLeft = false;
};

constexpr char kLeftBehind[] =
        "E the recording thread is left behind: a wait in the shared memory does not end";

// The mapping stays as long as the thread is in there, and no longer.
bool isLetGo(const sp<LocalMemory>& memory, int32_t references) {
    const auto giveUp = std::chrono::steady_clock::now() + kPatience;
    while (memory->getStrongCount() > references && std::chrono::steady_clock::now() < giveUp) {
        usleep(1000);
    }
    return memory->getStrongCount() == references;
}

TEST_F(TouchCompanionRecording, StopsAlthoughTheThreadsWaitDoesNotEnd) {
    StuckWait stuck(mWaits);
    const sp<TouchCompanionClient> client = record(mRing, Frames::callback, &mFrames);
    ASSERT_TRUE(stuck.waitUntilEntered());
    const auto before = std::chrono::steady_clock::now();
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_LT(std::chrono::steady_clock::now() - before, kPatience / 2);
    EXPECT_THAT(clientLines(), Contains(kLeftBehind));
    EXPECT_THAT(mService->calls(), ElementsAre("stopRecord"));

    // Of what it left behind the client knows nothing more: a frame finds no callback.
    mService->cblk = nullptr;
    EXPECT_LT(1, mRing.memory()->getStrongCount());
    mRing.put();
    ASSERT_TRUE(stuck.release());
    EXPECT_TRUE(isLetGo(mRing.memory(), 1));
    EXPECT_EQ(0u, mFrames.count());
}

// Far less than a wait may be overdue.
TEST_F(TouchCompanionRecording, LeavesNoThreadBehindWhoseWaitEndsInTime) {
    StuckWait stuck(mWaits);
    const sp<TouchCompanionClient> client = record(mRing, Frames::callback, &mFrames);
    ASSERT_TRUE(stuck.waitUntilEntered());
    std::thread stopping([&] { EXPECT_EQ(0, client->stopRecord()); });
    usleep(50000);
    EXPECT_TRUE(stuck.release());
    stopping.join();
    EXPECT_THAT(clientLines(), Not(Contains(kLeftBehind)));
}

TEST_F(TouchCompanionRecording, IsDestroyedAlthoughTheThreadsWaitDoesNotEnd) {
    StuckWait stuck(mWaits);
    sp<TouchCompanionClient> client = record(mRing, Frames::callback, &mFrames);
    ASSERT_TRUE(stuck.waitUntilEntered());
    client.clear();
    EXPECT_THAT(clientLines(), Contains(kLeftBehind));
    EXPECT_THAT(mService->calls(), ElementsAre("unregisterClient"));
    mService->cblk = nullptr;
    mRing.put();
    ASSERT_TRUE(stuck.release());
    EXPECT_TRUE(isLetGo(mRing.memory(), 1));
    EXPECT_EQ(0u, mFrames.count());
}

// A callback is never overtaken, however long it takes.
TEST_F(TouchCompanionRecording, WaitsForACallbackThatTakesItsTime) {
    struct Slow {
        std::atomic<bool> entered{false};
        std::atomic<bool> returned{false};

        static void callback(int, void*, unsigned long, void* context) {
            Slow& slow = *static_cast<Slow*>(context);
            slow.entered = true;
            usleep(1200000);  // longer than a wait may be overdue
            slow.returned = true;
        }
    };
    Slow slow;
    // The first wait is over long before the callback is.
    mWaits.onWait([this](int number) {
        if (number == 1) mRing.put();
    });
    const sp<TouchCompanionClient> client = record(mRing, Slow::callback, &slow);
    const auto giveUp = std::chrono::steady_clock::now() + kPatience;
    while (!slow.entered && std::chrono::steady_clock::now() < giveUp) {
        usleep(1000);
    }
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_TRUE(slow.returned);
    EXPECT_THAT(clientLines(), Not(Contains(kLeftBehind)));
}

// The shared mutex may be held for ever by a service that died, or be none at all.
TEST_F(TouchCompanionClientTest, DoesNotTouchTheSharedMutex) {
    FrameRing ring(8, 64);
    memset(&ring.cblk().mutex, 0xff, sizeof(ring.cblk().mutex));
    Frames frames;
    const sp<TouchCompanionClient> client = record(ring, Frames::callback, &frames);
    ring.put();
    EXPECT_TRUE(frames.waitFor(1));
    EXPECT_EQ(0, client->stopRecord());
    const std::vector<uint8_t> untouched(sizeof(ring.cblk().mutex), 0xff);
    EXPECT_EQ(0, memcmp(untouched.data(), &ring.cblk().mutex, untouched.size()));
}

// ---- no spinning ----

TEST_F(TouchCompanionRecording, MakesUpForAWaitThatFailsAtOnce) {
    mWaits.setWaitResult(EINVAL);
    const sp<TouchCompanionClient> client = record(mRing);
    TouchCompanionClient::FrameBuffer buffer = {nullptr, kFrameSize, 0};
    EXPECT_EQ(STATUS_TIMEOUT, client->acquireBuffer(&buffer));
    ASSERT_EQ(63u, mWaits.sleeps().size());
    for (useconds_t sleep : mWaits.sleeps()) {
        EXPECT_LE(sleep, 16001u);
    }
    EXPECT_GE(mWaits.sleeps()[0], 1u);
}

// A signal may come late, for a frame that was seen already; more than a few without a frame are
// none of a writer's.
TEST_F(TouchCompanionRecording, MakesUpForSignalsWithoutFrames) {
    mWaits.setWaitResult(0);
    const sp<TouchCompanionClient> client = record(mRing);
    TouchCompanionClient::FrameBuffer buffer = {nullptr, kFrameSize, 0};
    EXPECT_EQ(STATUS_TIMEOUT, client->acquireBuffer(&buffer));
    EXPECT_EQ(63u, mWaits.deadlines().size());
    EXPECT_EQ(63u - 8u, mWaits.sleeps().size());
}

TEST_F(TouchCompanionRecording, IsWokenByEverySignalWithAFrame) {
    mWaits.setWaitResult(0);
    mWaits.onWait([&](int) { mRing.put(); });
    const sp<TouchCompanionClient> client = record(mRing);
    for (int i = 0; i < 20; ++i) {
        TouchCompanionClient::FrameBuffer buffer = {nullptr, kBufferFrames * kFrameSize, 0};
        EXPECT_EQ(0, client->acquireBuffer(&buffer));
        client->releaseBuffer(&buffer);
    }
    EXPECT_THAT(mWaits.sleeps(), IsEmpty());
}

// Passes over a ring that breaks the rules pause, although there is nothing to wait for.
TEST_F(TouchCompanionRecording, DoesNotSpinOnARingThatNeverMoves) {
    struct Ring {
        const char* name;
        uint32_t bufferFrames;
        uint32_t frameSize;
        uint32_t write;
    };
    const Ring rings[] = {
            {"frames of no size", kBufferFrames, 0, 1},
            {"a ring of no frames", 0, kFrameSize, 1},
            {"more frames than there is room for", kBufferFrames, kFrameSize, 0x80000000},
    };
    for (const Ring& bad : rings) {
        FrameRing ring(kBufferFrames, kFrameSize);
        ring.cblk().bufferFrames = bad.bufferFrames;
        ring.cblk().frameSize = bad.frameSize;
        ring.cblk().write = bad.write;
        Frames frames;
        const sp<TouchCompanionClient> client = record(ring, Frames::callback, &frames);
        usleep(200000);
        EXPECT_EQ(0, client->stopRecord());
        EXPECT_GE(frames.count(), 1u) << bad.name;
        EXPECT_LE(frames.count(), 200u / 16 + 50) << bad.name << ": paused between passes";
    }
}

// ---- one pass of delivery ----

// Passes are called by the test: a recording without a thread, and a callback all the same, is what a thread
// that has ended by a refused stop leaves behind.
class TouchCompanionDelivery : public TouchCompanionRecording {
  protected:
    void SetUp() override {
        TouchCompanionRecording::SetUp();
        mRing.setStart(6);
        mClient = recordWithoutThread(mRing);
    }

    sp<TouchCompanionClient> recordWithoutThread(const FrameRing& ring) {
        sp<TouchCompanionClient> client = record(ring, Frames::callback, &mFrames);
        mService->setStatus("stopRecord", STATUS_INVALID_STATE);
        client->stopRecord();
        forget();
        return client;
    }

    static std::string linesPointer(const void* data) {
        char text[32];
        snprintf(text, sizeof(text), "%p", data);
        return text;
    }

    sp<TouchCompanionClient> mClient;
};

TEST_F(TouchCompanionDelivery, HandsOneFrameToTheCallbackAndReleasesIt) {
    mRing.put();
    mRing.put();
    // The length is the frame's own, whatever the size of the run.
    const uint32_t length = 1234567;
    memcpy(mRing.slot(6) + 8, &length, sizeof(length));
    mClient->processData();

    ASSERT_EQ(1u, mFrames.count());
    EXPECT_EQ(0, mFrames[0].zero);
    EXPECT_EQ(mRing.slot(6), mFrames[0].data);
    EXPECT_EQ(length, mFrames[0].length);
    EXPECT_EQ(7u, mRing.cblk().read);
    EXPECT_THAT(
            clientLines(),
            ElementsAre("D processData: acquire buffer",
                        "D acquireBuffer: write = 8, read = 6, reqSize = 1, availaSize = 2",
                        "D acquireBuffer: write = 8, read = 6, reqSize = 1, availSize = 2",
                        "D acquireBuffer: read = 6, bufferEnd = 8",
                        "D acquireBuffer: new reqSize = 1",
                        "D acquireBuffer: data = " + linesPointer(mRing.slot(6)) +
                                ", size = 64, frameCount = 1",
                        "D processData: buffer is acquired(buffer size = 64, packet size = 1234567",
                        "D releaseBuffer: read = 7, readWrap = 0", "D processData: finished"));
}

TEST_F(TouchCompanionDelivery, EndsAPassWithoutFramesWithItsStatus) {
    const size_t waitsBefore =
            mWaits.deadlines().size();  // the thread of the set-up may have waited
    mClient->processData();
    EXPECT_EQ(0u, mFrames.count());
    EXPECT_EQ(waitsBefore + 63, mWaits.deadlines().size());
    const Lines lines = clientLines();
    ASSERT_GE(lines.size(), 3u);
    EXPECT_EQ("E acquireBuffer: totalWaitTime exceeds, TIME_OUT", lines[lines.size() - 3]);
    EXPECT_EQ("E processData: buffer is not acquired(error = 1073741845)", lines[lines.size() - 2]);
    EXPECT_EQ("D processData: finished", lines.back());
}

TEST_F(TouchCompanionDelivery, DoesNothingWithoutABlock) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    client->processData();
    EXPECT_EQ(0u, mFrames.count());
}

// ---- bad blocks: the callback is called once a pass, and nothing outside the memory is read ----

TEST_F(TouchCompanionDelivery, CallsBackWithoutAFrameWhenFramesHaveNoSize) {
    mRing.put();
    mRing.cblk().frameSize = 0;
    mClient->processData();
    ASSERT_EQ(1u, mFrames.count());
    EXPECT_EQ(mRing.slot(0), mFrames[0].data) << "slots of no size are all the first";
    EXPECT_EQ(6u, mRing.cblk().read) << "no frame, none released";
    EXPECT_EQ("D processData: finished", clientLines().back());
    EXPECT_THAT(clientLines(), Not(Contains(::testing::HasSubstr("releaseBuffer"))));
}

TEST_F(TouchCompanionDelivery, ReadsNoLengthOutsideTheMemory) {
    struct Bad {
        const char* name;
        uint32_t bufferFrames;
        uint32_t frameSize;
        uint32_t read;
    };
    const Bad kBad[] = {
            {"no frames and no size", 0, 0, 0},
            {"no frames", 0, 64, 0},
            {"frames that are not there", 1000, 64, 500},
            {"frames beyond 4 GiB", 0xffffffff, 0xffffffff, 3},
            {"frames shorter than their header", 1, 8, 0},
    };
    for (const Bad& bad : kBad) {
        mService->setStatus("stopRecord", 0);
        // Memory for the block alone, or for less than a frame's header.
        const sp<LocalMemory> memory = new LocalMemory(136 + (bad.frameSize == 8 ? 8 : 0));
        TouchCompanionSharedCblk* block = new (memory->bytes()) TouchCompanionSharedCblk;
        block->bufferFrames = bad.bufferFrames;
        block->frameSize = bad.frameSize;
        mService->cblk = memory;
        const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
        client->setRecordOutput(1);
        client->startRecord();
        mService->setStatus("stopRecord", STATUS_INVALID_STATE);
        client->stopRecord();

        const size_t before = mFrames.count();
        block->read = bad.read;
        block->write = bad.read + 1;
        client->processData();
        ASSERT_EQ(before + 1, mFrames.count()) << bad.name;
        EXPECT_EQ(0u, mFrames[before].length) << bad.name;
        EXPECT_EQ(memory->bytes() + 136, mFrames[before].data) << bad.name;
    }
}

// The last slot of a ring that the service makes larger than its memory.
TEST_F(TouchCompanionDelivery, DeliversNoFrameThatEndsOutsideTheMemory) {
    for (uint32_t tooLong : {0u, 1u, 1000u}) {
        mRing.setStart(7);
        mRing.put();
        // Frame 7 begins where it did, but the frames behind it would not fit.
        mRing.cblk().frameSize = kFrameSize + tooLong;
        mRing.cblk().data = mRing.cblk().frames() - 7 * tooLong;
        const size_t before = mFrames.count();
        mClient->processData();
        ASSERT_EQ(before + 1, mFrames.count());
        EXPECT_EQ(tooLong == 0 ? mRing.slot(7) : mRing.slot(0), mFrames[before].data) << tooLong;
        EXPECT_EQ(tooLong == 0 ? kFrameSize : 0, mFrames[before].length) << tooLong;
        mRing.cblk().frameSize = kFrameSize;
        mRing.cblk().data = mRing.cblk().frames();
    }
}

TEST_F(TouchCompanionDelivery, ReadsNoLengthBeforeTheMemory) {
    mRing.put();
    mRing.cblk().readWrap = 1;  // frame 6 would lie two slots before the first
    mClient->processData();
    ASSERT_EQ(1u, mFrames.count());
    EXPECT_EQ(mRing.slot(0), mFrames[0].data);
    EXPECT_EQ(0u, mFrames[0].length);
}

TEST_F(TouchCompanionDelivery, ReadsNoLengthWhereTheServicePoints) {
    mRing.put();
    for (uintptr_t address : {uintptr_t{0}, uintptr_t{4096}, ~uintptr_t{0} - 1000}) {
        mRing.cblk().read = 6;
        mRing.cblk().readWrap = 0;
        mRing.cblk().data = reinterpret_cast<uint8_t*>(address);
        mClient->processData();
    }
    ASSERT_EQ(3u, mFrames.count());
    for (size_t i = 0; i < mFrames.count(); ++i) {
        EXPECT_EQ(mRing.slot(0), mFrames[i].data) << "a callback sees the memory alone";
        EXPECT_EQ(0u, mFrames[i].length);
    }
}

// ---- the frame rate ----

class TouchCompanionFrameRate : public TouchCompanionDelivery {
  protected:
    // Delivers a frame at `time` and returns the frame rate's line, if that wrote one.
    std::string deliverAt(nsecs_t time) {
        clearLog();
        mClock.set(time);
        mRing.put();
        mClient->processData();
        for (const std::string& line : clientLines()) {
            if (line.find("frameRate") != std::string::npos) return line;
        }
        return "";
    }

    FakeClock mClock;
};

TEST_F(TouchCompanionFrameRate, IsLoggedOnceASecond) {
    const nsecs_t start = 1000 * kSecond + 7;
    EXPECT_EQ("", deliverAt(start));
    EXPECT_EQ("", deliverAt(start + kSecond - 1));
    EXPECT_EQ("D frameRate = 3, total = 3, sec = 1", deliverAt(start + kSecond));
    EXPECT_EQ("", deliverAt(start + kSecond + 1));
    EXPECT_EQ("", deliverAt(start + 2 * kSecond - 1));
    EXPECT_EQ("D frameRate = 3, total = 6, sec = 2", deliverAt(start + 2 * kSecond));
    EXPECT_EQ("D frameRate = 2, total = 7, sec = 3", deliverAt(start + 4 * kSecond - 1));
}

TEST_F(TouchCompanionFrameRate, IsLoggedNoMoreOnceASecondWasSkipped) {
    deliverAt(0);
    EXPECT_EQ("D frameRate = 2, total = 2, sec = 1", deliverAt(kSecond));
    for (int second : {3, 4, 5, 2}) {
        EXPECT_EQ(second == 2 ? "D frameRate = 3, total = 6, sec = 2" : "",
                  deliverAt(second * kSecond));
    }
}

TEST_F(TouchCompanionFrameRate, IsNotLoggedForTimeThatRunsBackwards) {
    deliverAt(10 * kSecond);
    EXPECT_EQ("", deliverAt(9 * kSecond + 1));
    EXPECT_EQ("", deliverAt(8 * kSecond));
    EXPECT_EQ("D frameRate = 4, total = 4, sec = 1", deliverAt(11 * kSecond));
}

TEST_F(TouchCompanionFrameRate, BeginsAnewWithEachRecording) {
    deliverAt(0);
    deliverAt(kSecond);
    EXPECT_EQ("", deliverAt(5 * kSecond));

    mService->setStatus("stopRecord", 0);
    EXPECT_EQ(0, mClient->stopRecord());
    EXPECT_EQ(0, mClient->startRecord());
    mService->setStatus("stopRecord", STATUS_INVALID_STATE);
    mClient->stopRecord();
    EXPECT_EQ("", deliverAt(10 * kSecond));
    EXPECT_EQ("D frameRate = 2, total = 2, sec = 1", deliverAt(11 * kSecond));
}

TEST_F(TouchCompanionFrameRate, CountsPassesWithoutFramesToo) {
    mRing.put();
    mRing.cblk().frameSize = 0;
    mClock.set(0);
    mClient->processData();
    mClock.set(kSecond);
    mClient->processData();
    EXPECT_THAT(clientLines(), Contains("D frameRate = 2, total = 2, sec = 1"));
}

// ---- the thread ----

TEST_F(TouchCompanionRecording, CallsBackOnAThreadOfItsOwn) {
    const sp<TouchCompanionClient> client = record(mRing, Frames::callback, &mFrames);
    for (uint32_t i = 0; i < 3; ++i) {
        mRing.put();
    }
    ASSERT_TRUE(mFrames.waitFor(3));
    EXPECT_EQ(0, client->stopRecord());
    for (uint32_t i = 0; i < 3; ++i) {
        EXPECT_EQ(0, mFrames[i].zero);
        EXPECT_EQ(mRing.slot(i), mFrames[i].data);
        EXPECT_EQ(kFrameSize, mFrames[i].length);
        EXPECT_NE(std::this_thread::get_id(), mFrames[i].thread);
        EXPECT_EQ(mFrames[0].thread, mFrames[i].thread);
    }
}

TEST_F(TouchCompanionRecording, GoesOnAfterAPassWithoutFrames) {
    const sp<TouchCompanionClient> client = record(mRing, Frames::callback, &mFrames);
    const auto giveUp = std::chrono::steady_clock::now() + kPatience;
    while (mWaits.deadlines().size() < 2 * 63 && std::chrono::steady_clock::now() < giveUp) {
        usleep(1000);
    }
    mRing.put();
    EXPECT_TRUE(mFrames.waitFor(1));
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_THAT(clientLines(),
                Contains("E processData: buffer is not acquired(error = 1073741845)"));
}

// The thread works on nothing of the client's.
TEST_F(TouchCompanionRecording, MayBeLetGoInItsCallback) {
    struct Owner {
        sp<TouchCompanionClient> client;
        std::atomic<bool> letGo{false};

        static void callback(int, void*, unsigned long, void* context) {
            Owner& owner = *static_cast<Owner*>(context);
            owner.client.clear();
            owner.letGo = true;
        }
    };
    Owner owner;
    owner.client = record(mRing, Owner::callback, &owner);
    mRing.put();
    const auto giveUp = std::chrono::steady_clock::now() + kPatience;
    while (!owner.letGo && std::chrono::steady_clock::now() < giveUp) {
        usleep(1000);
    }
    ASSERT_TRUE(owner.letGo);
    EXPECT_THAT(mService->calls(), ElementsAre("unregisterClient"));
    mService->cblk = nullptr;
    EXPECT_TRUE(isLetGo(mRing.memory(), 1)) << "the thread has ended";
    EXPECT_EQ(1u, mRing.cblk().read) << "the frame was given back";
}

// A callback that does something with its client, and goes on until the test lets it go.
class Inside {
  public:
    using Deed = void (*)(TouchCompanionClient& client);

    explicit Inside(Deed deed) : mDeed(deed) {}

    static void callback(int, void*, unsigned long, void* context) {
        static_cast<Inside*>(context)->run();
    }

    void letGo() { mLetGo = true; }
    std::thread letGoSoon() {
        return std::thread([this] {
            usleep(50000);
            letGo();
        });
    }
    bool isInside() const { return mInside != 0; }
    bool wasAlone() const { return !mCrowded; }
    bool waitUntilDone() const {
        return waitFor([this] { return mDone.load(); });
    }

    template <typename Condition>
    static bool waitFor(Condition condition) {
        const auto giveUp = std::chrono::steady_clock::now() + kPatience;
        while (!condition() && std::chrono::steady_clock::now() < giveUp) {
            usleep(1000);
        }
        return condition();
    }

    TouchCompanionClient* client = nullptr;

  private:
    void run() {
        mCrowded = mCrowded || ++mInside > 1;
        if (!mDone && client != nullptr) {
            mDeed(*client);
            mDone = true;
        }
        waitFor([this] { return mLetGo.load(); });
        --mInside;
    }

    const Deed mDeed;
    std::atomic<int> mInside{0};
    std::atomic<bool> mCrowded{false};
    std::atomic<bool> mDone{false};
    std::atomic<bool> mLetGo{false};
};

void stopInside(TouchCompanionClient& client) {
    EXPECT_EQ(0, client.stopRecord());
}

// Whoever else ends the recording returns when no callback runs any more, also when the callback has
// asked for the end itself.
TEST_F(TouchCompanionRecording, EndsForOthersWhenTheCallbackThatStoppedItReturns) {
    Inside inside(stopInside);
    const sp<TouchCompanionClient> client = record(mRing, Inside::callback, &inside);
    inside.client = client.get();
    mRing.put();
    ASSERT_TRUE(inside.waitUntilDone());
    std::thread letting = inside.letGoSoon();
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_FALSE(inside.isInside());
    letting.join();
}

TEST_F(TouchCompanionRecording, IsDestroyedWhenTheCallbackThatStoppedItReturns) {
    Inside inside(stopInside);
    sp<TouchCompanionClient> client = record(mRing, Inside::callback, &inside);
    inside.client = client.get();
    mRing.put();
    ASSERT_TRUE(inside.waitUntilDone());
    std::thread letting = inside.letGoSoon();
    client.clear();
    EXPECT_FALSE(inside.isInside());
    letting.join();
}

TEST_F(TouchCompanionRecording, EndsForAllWhoStopItAtOnce) {
    Inside inside([](TouchCompanionClient&) {});
    const sp<TouchCompanionClient> client = record(mRing, Inside::callback, &inside);
    inside.client = client.get();
    mRing.put();
    ASSERT_TRUE(inside.waitUntilDone());
    const auto stop = [&] {
        EXPECT_EQ(0, client->stopRecord());
        EXPECT_FALSE(inside.isInside());
    };
    std::thread first(stop);
    std::thread second(stop);
    usleep(50000);
    inside.letGo();
    first.join();
    second.join();
}

// One frame at a time: the next recording's first waits for the callback that started it.
TEST_F(TouchCompanionRecording, DeliversOneFrameAtATimeAfterAStartInItsCallback) {
    Inside inside([](TouchCompanionClient& client) {
        EXPECT_EQ(0, client.stopRecord());
        EXPECT_EQ(0, client.startRecord());
    });
    const sp<TouchCompanionClient> client = record(mRing, Inside::callback, &inside);
    inside.client = client.get();
    mRing.put();
    ASSERT_TRUE(inside.waitUntilDone());
    mRing.put();
    usleep(50000);
    const auto taken = [&] { return TouchCompanionSharedCblk::acquireIndex(mRing.cblk().read); };
    EXPECT_EQ(0u, taken());
    inside.letGo();
    EXPECT_TRUE(Inside::waitFor([&] { return taken() == 2; }));
    EXPECT_TRUE(inside.wasAlone());
    EXPECT_EQ(0, client->stopRecord());
}

TEST_F(TouchCompanionRecording, MayBeStoppedAndStartedInItsCallbackAgainAndAgain) {
    Inside inside([](TouchCompanionClient& client) {
        for (int i = 0; i < 3; ++i) {
            EXPECT_EQ(0, client.stopRecord());
            EXPECT_EQ(0, client.startRecord());
        }
        EXPECT_EQ(0, client.stopRecord());
    });
    sp<TouchCompanionClient> client = record(mRing, Inside::callback, &inside);
    inside.client = client.get();
    mRing.put();
    ASSERT_TRUE(inside.waitUntilDone());
    mRing.put();
    inside.letGo();
    client.clear();
    EXPECT_EQ(1u, mRing.cblk().read) << "none of the last recording's";
    mService->cblk = nullptr;
    EXPECT_TRUE(isLetGo(mRing.memory(), 1)) << "all threads have ended";
}

// What is refused takes nothing from the recording that runs.
TEST_F(TouchCompanionRecording, GoesOnWhenAnotherStartIsRefused) {
    const sp<TouchCompanionClient> client = record(mRing, Frames::callback, &mFrames);
    mService->cblk = nullptr;
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord());
    mRing.put();
    EXPECT_TRUE(mFrames.waitFor(1));
    EXPECT_EQ(0, client->stopRecord());
}

#ifdef __GLIBC__
TEST_F(TouchCompanionRecording, FailsWithoutAThread) {
    const sp<TouchCompanionClient> client = connect(Frames::callback, &mFrames);
    mService->cblk = mRing.memory();
    client->setRecordOutput(1);
    forget();
    {
        const NoThreads none;
        EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->startRecord());
    }
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "getCblk"));
    EXPECT_THAT(clientLines(), ElementsAre("D Init: callback is set, create DebugThread",
                                           "E the recording thread cannot be started"));
    EXPECT_EQ(0, client->startRecord());
    mRing.put();
    EXPECT_TRUE(mFrames.waitFor(1));
    EXPECT_EQ(0, client->stopRecord());
}
#endif

// Checks each frame's bytes and that none is missing, in the callback, while the service writes.
struct StreamCheck {
    static void callback(int, void* data, unsigned long length, void* context) {
        StreamCheck& check = *static_cast<StreamCheck*>(context);
        const uint32_t number = check.seen.load();
        if (length != kFrameSize || !check.ring.holds(data, number)) {
            check.bad += 1;
        }
        check.seen = number + 1;
        if (number % 100 == 0) clearLog();
    }

    FrameRing& ring;
    std::atomic<uint32_t> seen{0};
    std::atomic<uint32_t> bad{0};
};

TEST_F(TouchCompanionRecording, DeliversEveryFrameOfAFastWriter) {
    constexpr uint32_t kFrames = 5000;
    mWaits.onWait([](int) { standAside(); });
    StreamCheck check{mRing};
    const sp<TouchCompanionClient> client = record(mRing, StreamCheck::callback, &check);
    const auto giveUp = std::chrono::steady_clock::now() + kPatience;
    for (uint32_t written = 0; check.seen < kFrames && std::chrono::steady_clock::now() < giveUp;) {
        if (written < kFrames && mRing.put()) {
            ++written;
        } else {
            standAside();
        }
    }
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_EQ(kFrames, check.seen);
    EXPECT_EQ(0u, check.bad);
}

}  // namespace
}  // namespace pemaro::test
