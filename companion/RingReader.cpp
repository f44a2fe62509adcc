// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "TouchCompanionClient"

#include "companion/RingReader.h"

#include <errno.h>
#include <log/log.h>
#include <time.h>
#include <utils/Timers.h>

#include <algorithm>

#include "binder/Waiting.h"
#include "pemaro/Status.h"

namespace pemaro {

namespace {

// The ring is looked at in steps of one wait; a recording without frames is reported about once a
// second.
constexpr int kRingWaitMs = 16;
constexpr int kRingTimeoutMs = 1000;

// Signals that announce nothing are answered at once this often before a wait is slept through: a
// writer may send one late, a condition that was written over may send them without end.
constexpr int kMaxWakesWithoutNews = 8;

nsecs_t nanosOf(const timespec& time) {
    return s2ns(time.tv_sec) + time.tv_nsec;
}

nsecs_t nowNanos() {
    timespec now;
    clock_gettime(CLOCK_REALTIME, &now);
    return nanosOf(now);
}

timespec deadlineIn(int milliseconds) {
    const nsecs_t nanos = nowNanos() + ms2ns(milliseconds);
    timespec deadline;
    deadline.tv_sec = static_cast<time_t>(ns2s(nanos));
    deadline.tv_nsec = static_cast<long>(nanos % s2ns(1));
    return deadline;
}

void sleepUntil(const timespec& deadline) {
    const nsecs_t left = std::min(nanosOf(deadline) - nowNanos(), ms2ns(kRingWaitMs));
    if (left > 0) {
        waitHooks().sleepMicros(static_cast<useconds_t>(ns2us(left) + 1));
    }
}

uint32_t readOnce(const uint32_t& field) {
    return __atomic_load_n(&field, __ATOMIC_RELAXED);
}

}  // namespace

RingReader::RingReader(const MappedBlock& block, WaitWatch* watch) : mBlock(block), mWatch(watch) {}

RingFields RingReader::fields() const {
    const TouchCompanionSharedCblk& cblk = *mBlock.cblk;
    return {readOnce(cblk.read), readOnce(cblk.readWrap), readOnce(cblk.bufferFrames),
            readOnce(cblk.frameSize),
            reinterpret_cast<uintptr_t>(__atomic_load_n(&cblk.data, __ATOMIC_RELAXED))};
}

int RingReader::acquire(const RingFields& fields, FrameBuffer* buffer) {
    const uint32_t read = fields.read;
    uint32_t write = TouchCompanionSharedCblk::acquireIndex(mBlock.cblk->write);
    const uint32_t wanted =
            fields.frameSize == 0 ? 0 : static_cast<uint32_t>(buffer->size / fields.frameSize);
    uint32_t available = write - read;
    ALOGD("acquireBuffer: write = %u, read = %u, reqSize = %u, availaSize = %u", write, read,
          wanted, available);
    const bool empty = write == read;
    if (empty) {
        int status = waitForFrames(write, available);
        if (status != STATUS_NO_ERROR) {
            mPace = Pace::Waited;
            return status;
        }
    }
    ALOGD("acquireBuffer: write = %u, read = %u, reqSize = %d, availSize = %u", write, read,
          static_cast<int>(wanted), available);

    uint32_t frames = std::min(available, wanted);
    const uint32_t bufferEnd = (fields.readWrap + 1) * fields.bufferFrames;
    ALOGD("acquireBuffer: read = %u, bufferEnd = %u", read, bufferEnd);
    frames = std::min(bufferEnd - read, frames);
    ALOGD("acquireBuffer: new reqSize = %u", frames);

    // In 32 bits, and a number until it is used: the other side can write anything into the block.
    const uint32_t slot = read - fields.bufferFrames * fields.readWrap;
    const uint32_t offset = slot * fields.frameSize;
    const uint32_t bytes = fields.frameSize * frames;
    // NOLINTNEXTLINE(performance-no-int-to-ptr): nothing is gained by a pointer into the unknown
    buffer->data = reinterpret_cast<void*>(fields.data + offset);
    buffer->frameCount = frames;
    buffer->size = bytes;
    ALOGD("acquireBuffer: data = %p, size = %zu, frameCount = %u", buffer->data, buffer->size,
          buffer->frameCount);
    mPace = empty                                            ? Pace::Waited
            : frames == 0 || available > fields.bufferFrames ? Pace::Stuck
                                                             : Pace::Moved;
    return STATUS_NO_ERROR;
}

// Waits until `write` moves. The frames are counted from the look before the last wait, and the
// time is judged before the frames: those that arrive in the 63rd wait are left to the next call.
int RingReader::waitForFrames(uint32_t& write, uint32_t& available) {
    int wakesWithoutNews = 0;
    for (int waitedMs = 0;;) {
        const uint32_t seen = TouchCompanionSharedCblk::acquireIndex(mBlock.cblk->write);
        available = seen - write;
        ALOGD("acquireBuffer: availaSize = %d, wait for sometime", static_cast<int>(available));
        if (!waitForWriter(seen, wakesWithoutNews)) {
            return kUnwanted;
        }
        waitedMs += kRingWaitMs;
        if (waitedMs >= kRingTimeoutMs) {
            ALOGE("acquireBuffer: totalWaitTime exceeds, TIME_OUT");
            return STATUS_TIMEOUT;
        }
        if (seen != write) {
            write = seen;
            return STATUS_NO_ERROR;
        }
    }
}

// One wait for the writer's signal. The mutex is the reader's own: the shared one guards nothing
// that is looked at here, and a service that died while it held it would keep the reader for ever
// in the wait's last step, which takes the mutex back. A wait that fails at once, or that ends
// again and again without a frame, is made up to its full length.
bool RingReader::waitForWriter(uint32_t seen, int& wakesWithoutNews) {
    const timespec deadline = deadlineIn(kRingWaitMs);
    pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
    pthread_mutex_lock(&mutex);
    if (mWatch != nullptr) {
        mWatch->waitBegins();
    }
    const int result = waitHooks().condTimedWait(&mBlock.cblk->cond, &mutex, &deadline);
    const bool wanted = mWatch == nullptr || mWatch->waitEnded();
    pthread_mutex_unlock(&mutex);
    pthread_mutex_destroy(&mutex);
    if (!wanted) {
        return false;
    }
    const bool woken =
            result == 0 && (TouchCompanionSharedCblk::acquireIndex(mBlock.cblk->write) != seen ||
                            ++wakesWithoutNews <= kMaxWakesWithoutNews);
    if (!woken && result != ETIMEDOUT) {
        sleepUntil(deadline);
    }
    return true;
}

void RingReader::release(const RingFields& fields, const FrameBuffer& buffer) {
    if (buffer.frameCount == 0) {
        return;
    }
    TouchCompanionSharedCblk& cblk = *mBlock.cblk;
    const uint32_t read = fields.read + buffer.frameCount;
    uint32_t readWrap = fields.readWrap;
    if (fields.bufferFrames == 0 ? read == 0 : read % fields.bufferFrames == 0) {
        readWrap += 1;
        __atomic_store_n(&cblk.readWrap, readWrap, __ATOMIC_RELAXED);
    }
    TouchCompanionSharedCblk::publishIndex(cblk.read, read);
    ALOGD("releaseBuffer: read = %u, readWrap = %u", read, readWrap);
}

bool RingReader::holds(const void* address, uint32_t frameSize) const {
    constexpr size_t kHeader = kFrameLengthOffset + sizeof(uint32_t);
    const size_t bytes = std::max<size_t>(frameSize, kHeader);
    const uintptr_t first = reinterpret_cast<uintptr_t>(mBlock.cblk->frames());
    const size_t ring = mBlock.memory->size() - kTouchCompanionRingOffset;
    const uintptr_t position = reinterpret_cast<uintptr_t>(address) - first;
    return position <= ring && ring - position >= bytes;
}

}  // namespace pemaro
