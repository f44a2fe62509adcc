// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <binder/MemoryBase.h>
#include <binder/MemoryHeapBase.h>
#include <pthread.h>
#include <sys/mman.h>

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <new>

#include "pemaro/TouchCompanionSharedCblk.h"

namespace pemaro {

/// The service's end of the shared ring of frames, for who implements ITouchCompanionService: it
/// makes the memory that getCblk() hands out, and writes frames into it while there is room.
///
///     mRing = RingWriter::create(getPacketSize(), 64);                  // in prepareRecord()
///     return mRing != nullptr ? mRing->memory() : nullptr;              // in getCblk()
///     if (!mRing->put(frame, length)) ++mDropped;                       // while recording
///
/// A frame is the service's to define, but for one thing: the unsigned 32-bit number at its byte 8 is
/// its length in bytes, which the client's callback is told. So it has 12 bytes at least. Neither is
/// looked at here; of a length that leads out of the ring the client delivers no frame.
///
/// One ring has one reader, so each client that records is given a ring of its own, and a new one
/// for each recording. The memory lives as long as the writer or a client holds it.
///
/// The reader is a process that may die or misbehave at any moment. So nothing in the block is
/// believed but `read`, and that only as a number; the writer keeps its own copies of the geometry
/// and of its index. It does not wait for room, does not take the block's mutex, which a reader that
/// was killed may hold for ever, and never destroys the mutex or the condition.
///
/// One thing it cannot avoid: with a C library that keeps a lock in a condition (glibc, not
/// bionic), a reader that was killed in its wait may have taken that lock along, and a hostile one
/// can write its word. Then put(), publish() or remind() never returns from the signal; the frame
/// is published by then. So call them on a thread that nobody joins without a limit, with no lock
/// held that others need, and let that thread share in what owns the writer.
///
/// All but memory() is for one thread at a time, which need not be the thread that made the writer.
/// The class is all in this header; libzelkclient exports nothing of it but the block's constructor.
class RingWriter {
  public:
    /// A ring of `ringFrames` frames of at most `frameBytes` bytes each; null when there is no
    /// memory for it. A ring whose number of frames is a power of two stays in step for ever; any
    /// other loses its place after 2^32 frames. `name` is what the memory is called in the
    /// maps of a device's processes.
    static std::unique_ptr<RingWriter> create(uint32_t frameBytes, uint32_t ringFrames,
                                              const char* name = "touch frames");

    /// What getCblk() returns.
    const android::sp<android::IMemory>& memory() const { return mMemory; }

    /// Copies a frame of `length` bytes, which is what its byte 8 tells too, into the ring, publishes
    /// it and wakes the reader. False, and nothing is done, when the ring is full or the frame is
    /// longer than a slot.
    bool put(const void* frame, size_t length);

    /// The same without a copy: the slot of the next frame, `frameBytes` long, to be filled in
    /// place, where an earlier frame's bytes are, or null when the ring is full. The reader sees it when publish() is called.
    uint8_t* next() const;

    /// Publishes the frame that next() gave room for, and wakes the reader. REQUIRES: next() has
    /// returned a slot since the last call.
    void publish();

    /// Signals once more while the reader has not taken every frame, and tells whether it had to.
    /// The signal of a frame wakes a waiting reader, but what ends its wait is what it saw before:
    /// it looks, and waits again, for 16 ms. A second signal, when it is back in its wait, delivers
    /// the frame then. A quarter of a millisecond after the frame, and while this returns true in
    /// intervals that double until the next frame is due, is a good time; each call costs a look at
    /// `read`, and a system call while the reader waits.
    bool remind();

    RingWriter(const RingWriter&) = delete;
    RingWriter& operator=(const RingWriter&) = delete;

  private:
    RingWriter(const android::sp<android::IMemory>& memory, TouchCompanionSharedCblk* block,
               uint32_t frameBytes, uint32_t ringFrames)
            : mMemory(memory), mBlock(block), mFrameBytes(frameBytes), mRingFrames(ringFrames) {}

    const android::sp<android::IMemory> mMemory;
    TouchCompanionSharedCblk* const mBlock;
    const uint32_t mFrameBytes;
    const uint32_t mRingFrames;
    uint32_t mWrite = 0;
    uint32_t mSlot = 0;
};

inline std::unique_ptr<RingWriter> RingWriter::create(uint32_t frameBytes, uint32_t ringFrames,
                                                      const char* name) {
    const size_t size = kTouchCompanionRingOffset + size_t{frameBytes} * ringFrames;
    const android::sp<android::MemoryHeapBase> heap = new android::MemoryHeapBase(size, 0, name);
    if (heap->getHeapID() < 0 || heap->getBase() == MAP_FAILED) {
        return nullptr;
    }
    auto* const block = new (heap->getBase()) TouchCompanionSharedCblk();
    block->bufferFrames = ringFrames;
    block->frameSize = frameBytes;
    const android::sp<android::IMemory> memory = new android::MemoryBase(heap, 0, size);
    return std::unique_ptr<RingWriter>(new RingWriter(memory, block, frameBytes, ringFrames));
}

inline uint8_t* RingWriter::next() const {
    const uint32_t waiting = mWrite - TouchCompanionSharedCblk::acquireIndex(mBlock->read);
    return waiting < mRingFrames ? mBlock->frames() + size_t{mSlot} * mFrameBytes : nullptr;
}

inline void RingWriter::publish() {
    if (++mSlot == mRingFrames) {
        mSlot = 0;
        mBlock->writeWrap += 1;
    }
    TouchCompanionSharedCblk::publishIndex(mBlock->write, ++mWrite);
    pthread_cond_signal(&mBlock->cond);
}

inline bool RingWriter::remind() {
    if (TouchCompanionSharedCblk::acquireIndex(mBlock->read) == mWrite) {
        return false;
    }
    pthread_cond_signal(&mBlock->cond);
    return true;
}

inline bool RingWriter::put(const void* frame, size_t length) {
    uint8_t* const slot = length <= mFrameBytes ? next() : nullptr;
    if (slot == nullptr) {
        return false;
    }
    memcpy(slot, frame, length);
    publish();
    return true;
}

}  // namespace pemaro
