// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <utils/Thread.h>

namespace pemaro {

class TouchCompanionClient;

/// Delivers recorded frames: runs the client's processData() again and again until it is told to
/// exit. The ring's own wait paces the loop.
class TouchCompanionThread : public android::Thread {
  public:
    /// `client` must outlive the running thread. It is no strong reference: that would keep a
    /// client which its caller has dropped alive, and recording, for ever.
    explicit TouchCompanionThread(TouchCompanionClient& client);

    void requestExit() override;

  private:
    bool threadLoop() override;

    TouchCompanionClient& mClient;
};

}  // namespace pemaro
