// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <mutex>
#include <vector>

#include "pemaro/ITouchCompanionFacade.h"
#include "tools/zelkctl/services/FrameReceiver.h"

namespace pemaro::zelkctl {

// The stream of frames through the shared ring. Where these return another exit status than that of
// success, the user has been told why.

/// Asks the service for its packet size and tells the receiver.
int preparePackets(ITouchCompanionFacade& facade, FrameReceiver& receiver);

/// Starts the stream; what was started is stopped again when it fails.
int startStream(ITouchCompanionFacade& facade);

/// Counts the frames of a stream, and keeps the latest intact one.
class LatestFrame {
  public:
    /// The data callback of the client; `context` is the object.
    static void onFrame(int, void* frame, unsigned long length, void* context);

    FrameReceiver& receiver() { return mReceiver; }

    /// Copies the latest frame, if there has been one since the last call.
    bool take(std::vector<uint8_t>* frame);

  private:
    void keep(const std::vector<uint8_t>& frame);

    FrameReceiver mReceiver{nullptr, 0};
    std::mutex mLock;
    std::vector<uint8_t> mFrame;
    bool mIsNew = false;
};

}  // namespace pemaro::zelkctl
