// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>
#include <thread>

#include "frames/FrameGenerator.h"
#include "simulator/companion/FrameSink.h"

namespace pemaro::simulator {

/// A running recording: a thread that draws frames at a fixed rate and puts them into a sink.
class Recording {
  public:
    struct Counts {
        uint64_t produced = 0;  ///< frames drawn, each with a sequence number of its own
        uint64_t dropped = 0;   ///< those of them that the sink had no room for
    };

    /// Starts the thread. `rate` is in frames a second; 0 draws a frame whenever the sink has room,
    /// so that none is ever dropped. `filter` may change while the recording runs.
    Recording(std::shared_ptr<FrameSink> sink, const frames::FrameGenerator& generator, double rate,
              std::shared_ptr<const std::atomic<uint32_t>> filter);

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
