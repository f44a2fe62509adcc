// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/RingWriter.h"

#include <binder/MemoryBase.h>
#include <binder/MemoryHeapBase.h>
#include <pthread.h>
#include <sys/mman.h>

#include <cstring>
#include <new>

using android::MemoryBase;
using android::MemoryHeapBase;
using android::sp;

namespace pemaro::simulator {

std::shared_ptr<RingWriter> RingWriter::create(uint32_t frameBytes, uint32_t ringFrames) {
    const size_t size = kTouchCompanionRingOffset + static_cast<size_t>(frameBytes) * ringFrames;
    sp<MemoryHeapBase> heap = new MemoryHeapBase(size, 0, "zelk-touchstack ring");
    if (heap->getHeapID() < 0 || heap->getBase() == MAP_FAILED) {
        return nullptr;
    }
    auto* block = new (heap->getBase()) TouchCompanionSharedCblk();
    block->bufferFrames = ringFrames;
    block->frameSize = frameBytes;
    sp<android::IMemory> memory = new MemoryBase(heap, 0, size);
    return std::shared_ptr<RingWriter>(new RingWriter(memory, block, frameBytes, ringFrames));
}

RingWriter::RingWriter(const sp<android::IMemory>& memory, TouchCompanionSharedCblk* block,
                       uint32_t frameBytes, uint32_t ringFrames)
        : mMemory(memory), mBlock(block), mFrameBytes(frameBytes), mRingFrames(ringFrames) {}

bool RingWriter::put(const void* frame, size_t length) {
    const uint32_t waiting = mWrite - TouchCompanionSharedCblk::acquireIndex(mBlock->read);
    if (waiting >= mRingFrames || length > mFrameBytes) {
        return false;
    }
    memcpy(mBlock->frames() + static_cast<size_t>(mSlot) * mFrameBytes, frame, length);
    if (++mSlot == mRingFrames) {
        mSlot = 0;
        mBlock->writeWrap += 1;
    }
    TouchCompanionSharedCblk::publishIndex(mBlock->write, ++mWrite);
    pthread_cond_signal(&mBlock->cond);
    return true;
}

}  // namespace pemaro::simulator
