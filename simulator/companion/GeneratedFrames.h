// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <utility>
#include <vector>

#include "frames/FrameGenerator.h"
#include "simulator/companion/FrameSource.h"

namespace pemaro::simulator {

/// Frames without end that a generator draws, so many a second.
class GeneratedFrames : public FrameSource {
  public:
    using Fingers = std::function<std::vector<frames::FingerRecord>()>;

    /// A rate of 0 is as fast as there is room. The fingers are those that `fingers` tells at that
    /// time, or, where it is null, the generator's.
    GeneratedFrames(frames::FrameGenerator generator, double rate, Fingers fingers = nullptr)
            : mGenerator(std::move(generator)),
              mPeriod(rate > 0 ? 1e9 / rate : 0),
              mFingers(std::move(fingers)) {}

    bool isPaced() const override { return mPeriod > 0; }

    std::optional<std::chrono::nanoseconds> due() const override {
        return std::chrono::nanoseconds(
                static_cast<int64_t>(mPeriod * static_cast<double>(mDrawn)));
    }

    Frame next(uint32_t sequence, uint64_t timeNs, uint32_t filter) override {
        mDrawn += 1;
        const std::vector<uint8_t>& frame =
                mFingers ? mGenerator.draw(sequence, timeNs, filter, mFingers())
                         : mGenerator.draw(sequence, timeNs, filter);
        return {frame.data(), frame.size()};
    }

  private:
    frames::FrameGenerator mGenerator;
    const double mPeriod;  ///< nanoseconds
    const Fingers mFingers;
    uint64_t mDrawn = 0;
};

}  // namespace pemaro::simulator
