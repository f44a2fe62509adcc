// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

#include "frames/FrameFile.h"
#include "frames/Sequence.h"

namespace pemaro::zelkctl {

/// What a recording brought so far.
struct FrameStats {
    uint64_t frames = 0;
    uint64_t bytes = 0;
    uint64_t gaps = 0;       ///< places where sequence numbers are missing
    uint64_t lost = 0;       ///< how many are missing there
    uint64_t corrupt = 0;    ///< frames that were not believed, and are neither counted nor written
    bool sequenced = false;  ///< whether the frames carry sequence numbers at all
    std::string firstCorrupt;  ///< what was wrong with the first corrupt one
};

/// What is missing, in words.
std::string describeLosses(const FrameStats& stats);

/// Takes the frames of a recording: checks, counts and writes them. What a frame tells of itself is
/// the service's word: of one that tells more bytes than a packet has nothing is touched, and of
/// one that ends outside the shared memory nothing is kept.
class FrameReceiver {
  public:
    /// `file` may be null; `limit` frames are taken, all if 0.
    FrameReceiver(frames::FrameFile* file, uint64_t limit) : mFile(file), mLimit(limit) {}

    /// To be told before the recording starts: no more than this is ever read of a frame.
    void setPacketSize(uint32_t bytes) { mPacketSize = bytes; }

    /// The data callback of the client; `context` is the receiver.
    static void onFrame(int, void* frame, unsigned long length, void* context);

    /// The same; returns its own copy of a frame that it took, which is good until the next call, or
    /// null. Who wants to look into a frame looks into the copy: where the frame came from, the
    /// service can still change it. Frames come from one thread.
    const std::vector<uint8_t>* take(const void* frame, size_t length);

    FrameStats stats() const;
    /// The same from a thread that must not wait; what was known a moment ago, at least.
    bool tryStats(FrameStats& stats) const;

    /// Waits until the receiver takes no more frames, having enough of them or nowhere to write
    /// them; false when that did not happen in time.
    bool waitUntilDone(std::chrono::milliseconds patience);

  private:
    std::string fetch(const void* frame, size_t length);
    std::string check();
    uint64_t number() const { return mStats.frames + mStats.corrupt; }
    void follow(uint32_t sequence);

    frames::FrameFile* const mFile;
    const uint64_t mLimit;
    uint32_t mPacketSize = 0;

    mutable std::mutex mLock;
    std::condition_variable mChanged;
    FrameStats mStats;
    bool mDone = false;
    std::vector<uint8_t> mFrame;
    frames::Sequence mSequence;
};

}  // namespace pemaro::zelkctl
