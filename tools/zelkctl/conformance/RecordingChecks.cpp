// SPDX-License-Identifier: Apache-2.0
#include <memory>  // before binder/IMemory.h, which uses it without including it

#include <binder/IMemory.h>
#include <fmt/core.h>
#include <pthread.h>
#include <time.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <thread>

#include "pemaro/Status.h"
#include "pemaro/TouchCompanionSharedCblk.h"
#include "tools/zelkctl/conformance/Conformance.h"

using android::IMemory;
using android::IMemoryHeap;
using android::Parcel;
using android::sp;

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

// Codes of the interface, and what is sent with them.
constexpr uint32_t kRegisterClient = 1;
constexpr uint32_t kUnregisterClient = 2;
constexpr uint32_t kOpen = 3;
constexpr uint32_t kGetCblk = 4;
constexpr uint32_t kPrepareRecord = 5;
constexpr uint32_t kStartRecord = 6;
constexpr uint32_t kStopRecord = 7;
constexpr uint32_t kSetRecordParameter = 13;
constexpr uint32_t kGetPacketSize = 20;
constexpr int32_t kOutputMemory = 1;

/// A frame ends behind its own length at the earliest.
constexpr uint32_t kLengthOffset = 8;
constexpr uint32_t kMinFrame = 12;

/// How many frames are looked at, and how long they are waited for.
constexpr uint32_t kFrames = 40;
constexpr milliseconds kFramePatience(3000);
/// How long nothing is read, to see the ring fill up.
constexpr milliseconds kFillTime(500);
constexpr milliseconds kStopTime(100);
constexpr milliseconds kSignalPatience(300);
constexpr int kWaits = 4;

/// The client's side of a shared block.
struct Block {
    sp<IMemory> memory;
    sp<IMemoryHeap> heap;
    TouchCompanionSharedCblk* control = nullptr;
    size_t size = 0;
    uint32_t frames = 0;
    uint32_t frameSize = 0;
};

/// What is wrong with the memory that a service handed over; else it is in `block`.
std::string readBlock(const Subject& subject, const sp<android::IBinder>& binder,
                      int32_t packetSize, Block* block) {
    if (binder == nullptr) {
        return "there is no memory";
    }
    block->memory = android::interface_cast<IMemory>(binder);
    ssize_t offset = 0;
    // The heap is the service's own object: it is asked for its descriptor.
    subject.ask("shared memory", [&] {
        block->heap = block->memory->getMemory(&offset, &block->size);
        return block->heap != nullptr && block->heap->getBase() != MAP_FAILED;
    });
    if (block->heap == nullptr || block->heap->getBase() == MAP_FAILED ||
        block->heap->getBase() == nullptr) {
        return "the memory cannot be mapped";
    }
    if (block->size < kTouchCompanionRingOffset) {
        return fmt::format("{} bytes are too few for the control block", block->size);
    }
    if ((block->heap->getFlags() & IMemoryHeap::READ_ONLY) != 0) {
        return "the memory is read-only";
    }
    auto* start = static_cast<uint8_t*>(block->heap->getBase()) + offset;
    if (reinterpret_cast<uintptr_t>(start) % alignof(TouchCompanionSharedCblk) != 0) {
        return "the control block is not aligned to 8 bytes";
    }
    block->control = reinterpret_cast<TouchCompanionSharedCblk*>(start);
    block->frames = block->control->bufferFrames;
    block->frameSize = block->control->frameSize;
    const uint64_t ring = uint64_t{block->frames} * block->frameSize;
    if (block->frames == 0 || block->frameSize < kMinFrame) {
        return fmt::format("a ring of {} frames of {} bytes", block->frames, block->frameSize);
    }
    if (ring > block->size - kTouchCompanionRingOffset) {
        return fmt::format("a ring of {} frames of {} bytes does not fit in {}", block->frames,
                           block->frameSize, block->size);
    }
    if (static_cast<int64_t>(block->frameSize) < packetSize) {
        return fmt::format("frames of {} bytes in the ring, and packets of {}", block->frameSize,
                           packetSize);
    }
    const uint32_t read = block->control->read;
    const uint32_t write = block->control->write;
    if (read != 0 || write != 0 || block->control->readWrap != 0) {
        return fmt::format("the indices begin at {} and {}", read, write);
    }
    return "";
}

/// Reads a ring as a client does, and notes what a good service would not do.
class RingReader {
  public:
    explicit RingReader(const Block& block) : mBlock(block), mControl(*block.control) {}

    /// Takes frames until there were enough of them; false when they do not come.
    bool takeFrames(uint32_t count) {
        const Clock::time_point deadline = Clock::now() + kFramePatience;
        for (uint32_t taken = 0; taken < count;) {
            const uint32_t there = available();
            for (uint32_t i = 0; i < there; ++i) {
                takeFrame();
            }
            taken += there;
            if (there == 0) {
                if (Clock::now() > deadline || !overrun().empty()) {
                    return false;
                }
                std::this_thread::sleep_for(milliseconds(1));
            }
        }
        return true;
    }

    /// Reads nothing for a while; the service must not write over what is unread.
    void letItFill() {
        const Clock::time_point end = Clock::now() + kFillTime;
        while (Clock::now() < end && available() < mBlock.frames && overrun().empty()) {
            std::this_thread::sleep_for(milliseconds(1));
        }
        for (int i = 0; i < 20; ++i) {
            available();
            std::this_thread::sleep_for(milliseconds(2));
        }
    }

    /// Whether a wait for a frame ends with a signal.
    bool isSignalled() {
        for (int i = 0; i < kWaits; ++i) {
            const uint32_t before = TouchCompanionSharedCblk::acquireIndex(mControl.write);
            if (waitForSignal() &&
                TouchCompanionSharedCblk::acquireIndex(mControl.write) != before) {
                return true;
            }
            takeFrames(available());
        }
        return false;
    }

    uint32_t written() const { return TouchCompanionSharedCblk::acquireIndex(mControl.write); }
    const std::string& overrun() const { return mOverrun; }
    const std::string& badLength() const { return mBadLength; }

  private:
    uint32_t available() {
        const uint32_t there = written() - mRead;
        if (there > mBlock.frames && mOverrun.empty()) {
            mOverrun = fmt::format("{} frames are unread in a ring of {}", there, mBlock.frames);
        }
        return there > mBlock.frames ? 0 : there;
    }

    void takeFrame() {
        const uint8_t* frame = mControl.frames() + size_t{mRead % mBlock.frames} * mBlock.frameSize;
        uint32_t length = 0;
        memcpy(&length, frame + kLengthOffset, sizeof(length));
        if ((length < kMinFrame || length > mBlock.frameSize) && mBadLength.empty()) {
            mBadLength = fmt::format("frame {} tells a length of {}, in slots of {}", mRead, length,
                                     mBlock.frameSize);
        }
        mRead += 1;
        if (mRead % mBlock.frames == 0) {
            mControl.readWrap += 1;
        }
        TouchCompanionSharedCblk::publishIndex(mControl.read, mRead);
    }

    bool waitForSignal() {
        timespec deadline{};
        clock_gettime(CLOCK_REALTIME, &deadline);
        deadline.tv_nsec += std::chrono::nanoseconds(kSignalPatience).count();
        deadline.tv_sec += deadline.tv_nsec / 1000000000;
        deadline.tv_nsec %= 1000000000;
        pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
        pthread_mutex_lock(&mutex);
        const int result = pthread_cond_timedwait(&mControl.cond, &mutex, &deadline);
        pthread_mutex_unlock(&mutex);
        return result == 0;
    }

    const Block& mBlock;
    TouchCompanionSharedCblk& mControl;
    uint32_t mRead = 0;
    std::string mOverrun;
    std::string mBadLength;
};

constexpr const char* kKeepsWithin = "keeps `write - read` within the ring";
constexpr const char* kFramesFit = "gives each frame a length that fits its slot";
constexpr const char* kSignals = "signals the condition after a frame";
constexpr const char* kStops = "writes no more once it was stopped";

/// One step of a session; false when it is not worth going on.
bool step(const Subject& subject, const char* check, uint32_t code,
          const std::function<void(Parcel&)>& arguments) {
    std::string problem;
    const int32_t status = subject.callForStatus(code, arguments, &problem);
    if (problem.empty() && status != STATUS_NO_ERROR) {
        subject.skip(check, fmt::format("the service said: {}", errStr(status)));
        return false;
    }
    subject.tell(check, problem);
    return problem.empty();
}

void checkFrames(const Subject& subject, const Block& block) {
    RingReader reader(block);
    if (!reader.takeFrames(kFrames) && reader.overrun().empty()) {
        subject.skip(kKeepsWithin, "no frames came");
    } else {
        const bool signalled = reader.overrun().empty() && reader.isSignalled();
        reader.letItFill();
        subject.tell(kKeepsWithin, reader.overrun());
        if (reader.overrun().empty()) {
            reader.takeFrames(block.frames);
            subject.tell(kFramesFit, reader.badLength());
            subject.tell(kSignals, signalled ? "" : "frames came, and no signal");
        }
    }
    if (step(subject, "stops a recording", kStopRecord, noArguments)) {
        const uint32_t written = reader.written();
        std::this_thread::sleep_for(kStopTime);
        const uint32_t more = reader.written() - written;
        subject.tell(kStops, more == 0 ? "" : fmt::format("{} frames came after that", more));
    }
}

void checkBlock(const Subject& subject, int32_t packetSize) {
    Parcel reply;
    const android::status_t result = subject.call(kGetCblk, noArguments, &reply);
    Block block;
    std::string problem =
            result == android::OK ? "" : fmt::format("the transaction ended with {}", result);
    if (problem.empty()) {
        problem = readBlock(subject, reply.readStrongBinder(), packetSize, &block);
    }
    subject.tell("shares a control block with a ring that fits", problem);
    if (problem.empty() && step(subject, "starts a recording", kStartRecord, noArguments)) {
        checkFrames(subject, block);
    }
}

}  // namespace

void checkRecording(const Subject& subject) {
    if (!subject.isInvasive()) {
        // A service may serve one client, whose recording would end.
        subject.skip("records to shared memory",
                     "it may take the recording of another client; see --invasive");
        return;
    }
    const sp<android::IBinder> client = new android::BBinder();
    const bool ready = step(subject, "registers a client", kRegisterClient,
                            [&client](Parcel& request) { request.writeStrongBinder(client); }) &&
                       step(subject, "opens", kOpen, noArguments) &&
                       step(subject, "records to shared memory", kSetRecordParameter,
                            [](Parcel& request) { request.writeInt32(kOutputMemory); }) &&
                       step(subject, "prepares a recording", kPrepareRecord, noArguments);
    if (ready) {
        Parcel reply;
        subject.call(kGetPacketSize, noArguments, &reply);
        checkBlock(subject, reply.readInt32());
    }
    Parcel reply;
    const android::status_t result = subject.call(kUnregisterClient, noArguments, &reply);
    subject.tell("lets a client go",
                 result == android::OK ? "" : fmt::format("the transaction ended with {}", result));
}

}  // namespace pemaro::zelkctl
