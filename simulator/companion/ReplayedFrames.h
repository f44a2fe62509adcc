// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "frames/RecordingFile.h"
#include "simulator/companion/FrameSource.h"

namespace pemaro::simulator {

/// A recording made ready to be played: its frames, and when each is due. They are kept in memory: the
/// file may go on or away while they are played.
class Replay {
  public:
    /// Null, with a sentence about why, when the file cannot be read or has no frame to play.
    /// The file is read twice, and each time `progress` is told of it as by a RecordingFile.
    static std::shared_ptr<const Replay> open(
            const std::string& path, std::string* problem,
            const frames::RecordingFile::Progress& progress = nullptr);

    size_t frames() const { return mFrames.size(); }
    size_t longestFrame() const { return mLongest; }
    std::chrono::nanoseconds duration() const { return mFrames.back().due; }
    /// Bytes of the file that are no frame and cannot be played.
    uint64_t leftOut() const { return mLeftOut; }

  private:
    friend class ReplayedFrames;

    struct Entry {
        std::vector<uint8_t> bytes;
        std::chrono::nanoseconds due;  ///< after the first
    };

    Replay() = default;
    bool load(const frames::RecordingFile& file, const frames::RecordingFile::Progress& progress);

    std::vector<Entry> mFrames;
    size_t mLongest = 0;
    uint64_t mLeftOut = 0;
};

/// The frames of a recording, bit for bit: their numbers, times and filter are those of then. A corrupt
/// frame is played as well, as long as its length can be believed.
class ReplayedFrames : public FrameSource {
  public:
    /// `speed` 2 is twice as fast, and 0 as fast as there is room. With `loop`, the first frame comes again
    /// after the last, an average interval later.
    ReplayedFrames(std::shared_ptr<const Replay> replay, double speed, bool loop);

    bool isPaced() const override { return mSpeed > 0; }
    std::optional<std::chrono::nanoseconds> due() const override;
    Frame next(uint32_t sequence, uint64_t timeNs, uint32_t filter) override;

  private:
    const std::shared_ptr<const Replay> mReplay;
    const double mSpeed;
    const bool mLoop;
    size_t mNext = 0;
    std::chrono::nanoseconds mRoundStart{0};
};

}  // namespace pemaro::simulator
