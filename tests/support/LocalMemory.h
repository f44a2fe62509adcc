// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "pemaro/Binder.h"
#include "pemaro/TouchCompanionSharedCblk.h"

namespace pemaro::test {

/// Shared memory that is not shared: one allocation of exactly `size` bytes, all zero, so that
/// AddressSanitizer sees any access beyond it.
class LocalMemory : public android::BnMemory {
  public:
    explicit LocalMemory(size_t size);

    /// One that could not be mapped: its pointer() is null.
    static android::sp<LocalMemory> unmapped();

    /// One that is mapped read-only, which its heap does not tell, as the platform's does not.
    static android::sp<LocalMemory> readOnly(size_t size);

    /// One that begins `offset` bytes behind the start of its heap.
    static android::sp<LocalMemory> atOffset(size_t offset, size_t size);

    uint8_t* bytes() const;

    android::sp<android::IMemoryHeap> getMemory(ssize_t* offset = nullptr,
                                                size_t* size = nullptr) const override;

  private:
    class Heap;
    explicit LocalMemory(const android::sp<Heap>& heap, size_t offset = 0);
    ~LocalMemory() override;

    const android::sp<Heap> mHeap;
    const size_t mOffset;
};

/// A control block with its ring, and the service's side of it.
///
/// A frame begins with its number and carries its length at byte 8; the rest is a pattern made from
/// the number, so that a torn or misplaced frame is known by its bytes.
class FrameRing {
  public:
    /// `frameSize` is at least 12. The block's indices may be set before use, with setStart().
    FrameRing(uint32_t bufferFrames, uint32_t frameSize);

    const android::sp<LocalMemory>& memory() const { return mMemory; }
    TouchCompanionSharedCblk& cblk() const { return *mCblk; }
    uint8_t* slot(uint32_t index) const;

    /// Both sides begin at frame `number`, as if that many had gone through. REQUIRES: a number
    /// that is a multiple of the ring, or a ring that is a power of two.
    void setStart(uint32_t number);

    /// Writes the next frame, announces it and wakes the reader; false when the ring is full.
    bool put();

    /// Whether `frame` holds frame `number` as put() wrote it.
    bool holds(const void* frame, uint32_t number) const;

  private:
    uint8_t pattern(uint32_t number, uint32_t offset) const;

    const uint32_t mFrameSize;
    const uint32_t mBufferFrames;
    const android::sp<LocalMemory> mMemory;
    TouchCompanionSharedCblk* const mCblk;
};

}  // namespace pemaro::test
