// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>

#include "pemaro/Binder.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/TouchCompanionSharedCblk.h"

namespace pemaro {

// The reader's side of the shared ring (docs/shared-ring.md). The other side can write anything
// into the block at any time, and can die at any point: each field is read once a pass, addresses
// are numbers until they have been compared with the mapping, and no wait needs the other side in
// order to end.

/// A block of the service's: where it is mapped, and what keeps it mapped.
struct MappedBlock {
    android::sp<android::IMemory> memory;
    TouchCompanionSharedCblk* cblk = nullptr;
};

/// Told of every wait on the condition in the shared block, which alone may not end in time: the C
/// library's own lock may lie in there, taken for ever by a writer that died.
class WaitWatch {
  public:
    virtual void waitBegins() = 0;

    /// False when nobody wants the wait's result any more.
    virtual bool waitEnded() = 0;

  protected:
    ~WaitWatch() = default;
};

/// The fields of a block at one moment, but for `write`.
struct RingFields {
    uint32_t read;
    uint32_t readWrap;
    uint32_t bufferFrames;
    uint32_t frameSize;
    uintptr_t data;
};

class RingReader {
  public:
    using FrameBuffer = TouchCompanionClient::FrameBuffer;

    /// The result of acquire() when the watch wanted no more; no status of the library's.
    static constexpr int kUnwanted = -1;

    /// Whether a pass was held up by the ring, and if not, whether it may follow the last at once.
    enum class Pace { Waited, Moved, Stuck };

    /// `block.cblk` must not be null; a `watch` must outlive the reader.
    explicit RingReader(const MappedBlock& block, WaitWatch* watch = nullptr);

    const MappedBlock& block() const { return mBlock; }

    RingFields fields() const;

    /// TouchCompanionClient::acquireBuffer() with the fields read before.
    int acquire(const RingFields& fields, FrameBuffer* buffer);

    /// Gives the frames of acquire() back.
    void release(const RingFields& fields, const FrameBuffer& buffer);

    /// What the last acquire() met.
    Pace pace() const { return mPace; }

    /// Whether a whole frame at `address`, its header included, lies in the ring's memory.
    bool holds(const void* address, uint32_t frameSize) const;

  private:
    int waitForFrames(uint32_t& write, uint32_t& available);
    bool waitForWriter(uint32_t seen, int& wakesWithoutNews);

    const MappedBlock mBlock;
    WaitWatch* const mWatch;
    Pace mPace = Pace::Moved;
};

/// A frame tells its own length in bytes here, as an unsigned 32-bit number.
constexpr size_t kFrameLengthOffset = 8;

}  // namespace pemaro
