// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <pthread.h>

#include <cstddef>
#include <cstdint>

#include "pemaro/Export.h"

namespace pemaro {

/// The control block at the start of the memory that the service shares with a recording client;
/// the ring of frames follows it. The layout is the contract between two 64-bit processes,
/// little-endian:
///
///   offset  size  field          written by
///        0    40  mutex          the service, if it likes; the client never takes it
///       40    48  cond           both; the service signals it after adding frames
///       88     4  read           client: frames consumed since the start
///       92     4  write          service: frames produced since the start
///       96     4  readWrap       client: how often `read` reached a multiple of `bufferFrames`
///      100     4  writeWrap      service: its counterpart
///      104     8  data           client: its own address of offset 136
///      112     8  reserved
///      120     4  headerSize     service, 120; of no use to the client
///      124     4  bufferFrames   service: frames in the ring
///      128     4  frameSize      service: bytes per frame
///      132     4  reserved
///      136     .  the ring: bufferFrames x frameSize bytes
///
/// `read` and `write` count on without end and wrap at 2^32; they are never reduced modulo the
/// ring. The service keeps `write - read` at most `bufferFrames`. Frame number n lies at
/// `data + (n - bufferFrames * readWrap) * frameSize`.
///
/// There is one writer and one reader, and no lock is taken to move the indices. Each side
/// publishes its index with publishIndex() after it has finished with the frames, and looks at the
/// other's with acquireIndex() before it touches them: on Arm nothing else keeps a frame's bytes
/// and the index that announces them in order.
struct TouchCompanionSharedCblk {
    /// Run by the side that creates the block, once, before it shares the memory.
    ZELK_API TouchCompanionSharedCblk();

    /// What each is for is told above.
    pthread_mutex_t mutex;
    pthread_cond_t cond;
    uint32_t read;
    uint32_t write;
    uint32_t readWrap;
    uint32_t writeWrap;
    uint8_t* data;
    uint64_t reserved;
    uint32_t headerSize;
    uint32_t bufferFrames;
    uint32_t frameSize;
    uint32_t reserved2;

    /// The other side's index; what it published before is visible to the caller afterwards.
    static uint32_t acquireIndex(const uint32_t& index) {
        return __atomic_load_n(&index, __ATOMIC_ACQUIRE);
    }

    /// Moves the caller's own index; all that the caller did to the frames happens before.
    static void publishIndex(uint32_t& index, uint32_t value) {
        __atomic_store_n(&index, value, __ATOMIC_RELEASE);
    }

    /// The first byte of the ring in the calling process, whatever `data` holds.
    uint8_t* frames();
};

/// Where the ring starts in the shared memory, in bytes.
constexpr size_t kTouchCompanionRingOffset = 136;

static_assert(offsetof(TouchCompanionSharedCblk, mutex) == 0, "shared layout");
static_assert(sizeof(pthread_mutex_t) == 40,
              "a mutex of another size does not fit the shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, cond) == 40, "shared layout");
static_assert(sizeof(pthread_cond_t) == 48,
              "a condition of another size does not fit the shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, read) == 88, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, write) == 92, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, readWrap) == 96, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, writeWrap) == 100, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, data) == 104, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, reserved) == 112, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, headerSize) == 120, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, bufferFrames) == 124, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, frameSize) == 128, "shared layout");
static_assert(offsetof(TouchCompanionSharedCblk, reserved2) == 132, "shared layout");
static_assert(sizeof(TouchCompanionSharedCblk) == kTouchCompanionRingOffset, "shared layout");

inline uint8_t* TouchCompanionSharedCblk::frames() {
    return reinterpret_cast<uint8_t*>(this) + kTouchCompanionRingOffset;
}

}  // namespace pemaro
