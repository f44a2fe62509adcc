// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>

#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "frames/Frame.h"

struct libevdev;

namespace pemaro::simulator {

/// A touch screen of this machine's, as the kernel's input devices are: /dev/input/event0 and so on.
/// May be used by any thread.
class TouchScreen {
  public:
    /// Null, with a sentence about why, when there is no such device or it is no touch screen.
    static std::shared_ptr<TouchScreen> open(const std::string& path, std::string* problem);

    /// The paths of all devices in a folder that are touch screens and can be read.
    static std::vector<std::string> list(const std::string& folder = "/dev/input");

    ~TouchScreen();

    const std::string& path() const { return mPath; }
    std::string name() const;
    /// How many fingers it tells apart.
    uint32_t maxFingers() const { return mMaxFingers; }

    /// The fingers that are on it now; none when it was lost.
    std::vector<frames::FingerRecord> fingers();

    /// Whether it is there no more: unplugged, or its driver unloaded.
    bool isLost();

  private:
    struct Closer {
        void operator()(libevdev* device) const;
    };

    TouchScreen(std::string path, android::base::unique_fd fd,
                std::unique_ptr<libevdev, Closer> device);

    void takeEvents();

    const std::string mPath;
    const android::base::unique_fd mFd;
    std::mutex mLock;
    const std::unique_ptr<libevdev, Closer> mDevice;
    const uint32_t mMaxFingers;
    bool mIsLost = false;
};

}  // namespace pemaro::simulator
