// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <string>

#include "pemaro/TouchCompanionClient.h"

namespace pemaro::test {

/// Takes the frames of a client of this very process,
/// and checks the checksum of each and that the sequence has no gap.
///
///     FrameCollector frames;
///     sp<TouchCompanionClient> client = frames.makeClient();
///     ...
///     ASSERT_TRUE(frames.await(100));
///     EXPECT_EQ("", frames.firstFault());
class FrameCollector {
  public:
    android::sp<TouchCompanionClient> makeClient();

    /// A client that has been connected and told to record to shared memory; null, and the test has
    /// failed, when that was refused.
    android::sp<TouchCompanionClient> connect();

    /// Each frame takes this long from now on.
    void setPause(std::chrono::milliseconds pause);

    /// Forgets everything: the next recording begins.
    void clear();

    /// Waits until `count` frames have come since clear().
    bool await(uint64_t count);

    uint64_t frames() const;
    uint64_t lost() const;
    /// What was wrong first: a frame that is not intact. A lost frame is no fault.
    std::string firstFault() const;

  private:
    static void onFrame(int, void* frame, unsigned long bytes, void* context);
    void take(const void* frame, size_t bytes);

    mutable std::mutex mLock;
    std::condition_variable mChanged;
    std::chrono::milliseconds mPause{0};
    uint64_t mFrames = 0;
    uint64_t mLost = 0;
    uint32_t mNextSequence = 0;
    std::string mFirstFault;
};

/// The number of whole and intact frames in a file, or -1 when there is anything else in it.
int countFrames(const std::string& path);

}  // namespace pemaro::test
