// SPDX-License-Identifier: Apache-2.0

/// garbage-service: a touch companion service that answers what no service should, until it is killed.
///
///     garbage-service reply [NUMBER]...     every call is answered with these 32-bit numbers
///     garbage-service block FRAMES BYTES LENGTH
///         calls succeed, with packets of 4096 bytes; a recording has a block for 8 frames of 4096
///         bytes whose bufferFrames and frameSize are FRAMES and BYTES, and in which each frame
///         tells LENGTH; its write index moves on without regard for the reader
///     garbage-service no-block              the same with a null binder for the block
///     garbage-service short-block           the same with a block that is too short for its header
///     garbage-service read-only-block       the same with a block that is mapped read-only
///     garbage-service misaligned-block      the same with a block at an odd address
///     garbage-service ruined-block WHAT     the same with a good block that gets no frame, and that
///         is ruined when the recording has started: "held-mutex" is as if the service were killed
///         while it holds the mutex, "dead-signal" as if it were killed inside pthread_cond_signal,
///         "clock" makes the condition count on another clock, "mutex" fills the mutex with ones

#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>
#include <binder/MemoryBase.h>
#include <binder/MemoryHeapBase.h>
#include <binder/ProcessState.h>
#include <pthread.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>
#include <string>
#include <thread>
#include <vector>

#include "binder/PlatformShims.h"
#include "pemaro/TouchCompanionSharedCblk.h"
#include "tests/support/ConditionWords.h"
#include "tools/common/BinderDriver.h"

using android::BBinder;
using android::IBinder;
using android::IMemory;
using android::MemoryBase;
using android::MemoryHeapBase;
using android::Parcel;
using android::sp;
using android::status_t;
using android::String16;

namespace pemaro::test {

namespace {

constexpr uint32_t kGetCblk = 4;
constexpr uint32_t kStartRecord = 6;
constexpr uint32_t kGetPacketSize = 20;
constexpr uint32_t kRingFrames = 8;
constexpr uint32_t kFrameBytes = 4096;
constexpr size_t kShortBlock = 64;

uint32_t number(const char* text) {
    return static_cast<uint32_t>(strtoll(text, nullptr, 0));
}

// Answers calls of the interface; those of the platform itself are answered as usual.
class GarbageService : public BBinder {
  public:
    status_t onTransact(uint32_t code, const Parcel& data, Parcel* reply, uint32_t flags) override {
        if (code > LAST_CALL_TRANSACTION) {
            return BBinder::onTransact(code, data, reply, flags);
        }
        answer(code, reply);
        return android::OK;
    }

  private:
    virtual void answer(uint32_t code, Parcel* reply) = 0;
};

class FixedReply : public GarbageService {
  public:
    explicit FixedReply(const std::vector<uint32_t>& numbers) : mNumbers(numbers) {}

  private:
    void answer(uint32_t /* code */, Parcel* reply) override {
        for (uint32_t value : mNumbers) {
            reply->writeUint32(value);
        }
    }

    const std::vector<uint32_t> mNumbers;
};

class BlockReply : public GarbageService {
  public:
    explicit BlockReply(const sp<IMemory>& memory) : mMemory(memory) {}

  private:
    void answer(uint32_t code, Parcel* reply) override {
        if (code == kGetCblk) {
            reply->writeStrongBinder(android::IInterface::asBinder(mMemory));
            return;
        }
        reply->writeInt32(code == kGetPacketSize ? static_cast<int32_t>(kFrameBytes) : 0);
        if (code == kStartRecord && mMemory != nullptr && mMemory->size() > kShortBlock) {
            std::thread([this] { moveOn(); }).detach();
        }
    }

    [[noreturn]] void moveOn() {
        auto* block = static_cast<TouchCompanionSharedCblk*>(mappedAddress(mMemory));
        for (uint32_t write = 1;; ++write) {
            TouchCompanionSharedCblk::publishIndex(block->write, write);
            pthread_cond_signal(&block->cond);
            usleep(2000);
        }
    }

    const sp<IMemory> mMemory;
};

class RuinedBlock : public GarbageService {
  public:
    RuinedBlock(const sp<IMemory>& memory, const std::string& what)
            : mMemory(memory), mWhat(what) {}

  private:
    void answer(uint32_t code, Parcel* reply) override {
        if (code == kGetCblk) {
            reply->writeStrongBinder(android::IInterface::asBinder(mMemory));
            return;
        }
        reply->writeInt32(code == kGetPacketSize ? static_cast<int32_t>(kFrameBytes) : 0);
        if (code == kStartRecord) {
            ruin(static_cast<TouchCompanionSharedCblk*>(mappedAddress(mMemory)));
        }
    }

    void ruin(TouchCompanionSharedCblk* block) {
        if (mWhat == "held-mutex") {
            pthread_mutex_lock(&block->mutex);
        } else if (mWhat == "dead-signal") {
            setConditionBits(block->cond, kConditionLock, kConditionLocked);
        } else if (mWhat == "clock") {
            setConditionBits(block->cond, kConditionFlags, kConditionMonotonic);
        } else {
            memset(&block->mutex, 0xff, sizeof(block->mutex));
        }
    }

    const sp<IMemory> mMemory;
    const std::string mWhat;
};

sp<IMemory> makeBlock(uint32_t bufferFrames, uint32_t frameSize, uint32_t length) {
    const size_t size = kTouchCompanionRingOffset + kRingFrames * kFrameBytes;
    sp<MemoryHeapBase> heap = new MemoryHeapBase(size);
    auto* block = new (heap->getBase()) TouchCompanionSharedCblk();
    block->bufferFrames = bufferFrames;
    block->frameSize = frameSize;
    for (uint32_t i = 0; i < kRingFrames; ++i) {
        memcpy(block->frames() + i * kFrameBytes + 8, &length, sizeof(length));
    }
    return new MemoryBase(heap, 0, size);
}

sp<BBinder> makeService(int argc, char** argv) {
    const std::string mode = argc > 1 ? argv[1] : "";
    if (mode == "reply") {
        std::vector<uint32_t> numbers;
        for (int i = 2; i < argc; ++i) {
            numbers.push_back(number(argv[i]));
        }
        return new FixedReply(numbers);
    }
    if (mode == "block" && argc == 5) {
        return new BlockReply(makeBlock(number(argv[2]), number(argv[3]), number(argv[4])));
    }
    if (mode == "no-block") {
        return new BlockReply(nullptr);
    }
    if (mode == "short-block") {
        sp<MemoryHeapBase> heap = new MemoryHeapBase(kShortBlock);
        return new BlockReply(new MemoryBase(heap, 0, kShortBlock));
    }
    if (mode == "read-only-block") {
        return new BlockReply(
                new MemoryBase(new MemoryHeapBase(size_t{kFrameBytes}, MemoryHeapBase::READ_ONLY),
                               0, kFrameBytes));
    }
    if (mode == "misaligned-block") {
        return new BlockReply(
                new MemoryBase(new MemoryHeapBase(size_t{2 * kFrameBytes}), 4, kFrameBytes));
    }
    if (mode == "ruined-block" && argc == 3) {
        return new RuinedBlock(makeBlock(kRingFrames, kFrameBytes, 0), argv[2]);
    }
    return nullptr;
}

}  // namespace

}  // namespace pemaro::test

int main(int argc, char** argv) {
    const std::string problem = pemaro::tools::binderProblem();
    if (!problem.empty()) {
        fprintf(stderr, "garbage-service: %s\n", problem.c_str());
        return 1;
    }
    const sp<BBinder> service = pemaro::test::makeService(argc, argv);
    if (service == nullptr) {
        fprintf(stderr, "garbage-service: wrong usage\n");
        return 2;
    }
    android::ProcessState::self()->startThreadPool();
    android::defaultServiceManager()->addService(String16("pemaro.TouchService"), service);
    printf("process %d\n", getpid());
    fflush(stdout);
    pause();
}
