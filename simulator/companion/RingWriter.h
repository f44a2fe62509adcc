// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>  // before binder/IMemory.h, which uses it without including it

#include <binder/IMemory.h>

#include <cstdint>

#include "pemaro/TouchCompanionSharedCblk.h"
#include "simulator/companion/FrameSink.h"

namespace pemaro::simulator {

/// The service's end of the shared ring. It makes the memory, and writes frames into it while there
/// is room; see TouchCompanionSharedCblk.h for the layout.
///
/// The other end is a process that may die or misbehave at any moment, so nothing in the block is
/// believed but `read`, and that only as a number: the writer keeps its own copies of the geometry
/// and of its index.
/// It never takes the block's mutex, which a reader that was killed may hold for ever, and never
/// destroys the mutex or the condition, for which it would have to wait for a reader that is no more.
class RingWriter : public FrameSink {
  public:
    /// Null when there is no memory for the block.
    static std::shared_ptr<RingWriter> create(uint32_t frameBytes, uint32_t ringFrames);

    /// What getCblk() hands out.
    const android::sp<android::IMemory>& memory() const { return mMemory; }

    bool put(const void* frame, size_t length) override;

  private:
    RingWriter(const android::sp<android::IMemory>& memory, TouchCompanionSharedCblk* block,
               uint32_t frameBytes, uint32_t ringFrames);

    const android::sp<android::IMemory> mMemory;
    TouchCompanionSharedCblk* const mBlock;
    const uint32_t mFrameBytes;
    const uint32_t mRingFrames;
    uint32_t mWrite = 0;
    uint32_t mSlot = 0;
};

}  // namespace pemaro::simulator
