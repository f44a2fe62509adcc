// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <memory>
#include <thread>

#include "simulator/companion/FrameSink.h"
#include "simulator/companion/FrameSource.h"

namespace pemaro::simulator {

/// A running recording: a thread that takes frames from a source when they are due and puts them into a
/// sink.
class Recording {
  public:
    struct Counts {
        uint64_t produced = 0;  ///< frames of the source
        uint64_t dropped = 0;   ///< those of them that the sink had no room for
    };

    /// Starts the thread. A frame that is due and finds no room is dropped; one of a source without a
    /// pace waits for room. `filter` may change while the recording runs. While a frame of a source
    /// with a pace is not taken, the sink is reminded of it after `remindAfter`, and then in intervals
    /// that double, until the next frame is due; never when that is 0.
    Recording(std::shared_ptr<FrameSink> sink, std::unique_ptr<FrameSource> source,
              std::shared_ptr<const std::atomic<uint32_t>> filter,
              std::chrono::microseconds remindAfter = {});

    /// Stops the recording.
    ~Recording();

    /// Ends the thread and tells what it did. A thread that does not end within two seconds is
    /// abandoned with all that it uses: a reader that was killed inside a wait on the shared
    /// condition can leave it in a state that blocks whoever signals it.
    Counts stop();

  private:
    struct Worker;

    std::shared_ptr<Worker> mWorker;
    std::thread mThread;
};

}  // namespace pemaro::simulator
