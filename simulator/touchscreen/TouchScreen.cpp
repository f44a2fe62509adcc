// SPDX-License-Identifier: Apache-2.0
#include "simulator/touchscreen/TouchScreen.h"

#include <dirent.h>
#include <fcntl.h>
#include <libevdev/libevdev.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <utility>

#include "simulator/touchscreen/Contacts.h"

namespace pemaro::simulator {

void TouchScreen::Closer::operator()(libevdev* device) const {
    libevdev_free(device);
}

std::shared_ptr<TouchScreen> TouchScreen::open(const std::string& path, std::string* problem) {
    android::base::unique_fd fd(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    if (!fd.ok()) {
        *problem = "cannot open " + path + ": " + strerror(errno);
        return nullptr;
    }
    libevdev* device = nullptr;
    const int failure = libevdev_new_from_fd(fd.get(), &device);
    if (failure != 0) {
        *problem = path + " is no input device: " + strerror(-failure);
        return nullptr;
    }
    std::unique_ptr<libevdev, Closer> owner(device);
    const std::string fault = touchScreenFault(device);
    if (!fault.empty()) {
        *problem = path + " (" + libevdev_get_name(device) + ") is no touch screen: " + fault;
        return nullptr;
    }
    return std::shared_ptr<TouchScreen>(new TouchScreen(path, std::move(fd), std::move(owner)));
}

std::vector<std::string> TouchScreen::list(const std::string& folder) {
    const std::unique_ptr<DIR, int (*)(DIR*)> entries(opendir(folder.c_str()), closedir);
    std::vector<std::string> paths;
    while (const dirent* entry = entries ? readdir(entries.get()) : nullptr) {
        std::string problem;
        const std::string path = folder + "/" + entry->d_name;
        if (strncmp(entry->d_name, "event", 5) == 0 && open(path, &problem) != nullptr) {
            paths.push_back(path);
        }
    }
    std::sort(paths.begin(), paths.end());
    return paths;
}

TouchScreen::TouchScreen(std::string path, android::base::unique_fd fd,
                         std::unique_ptr<libevdev, Closer> device)
        : mPath(std::move(path)),
          mFd(std::move(fd)),
          mDevice(std::move(device)),
          mMaxFingers(contactLimit(mDevice.get())) {}

TouchScreen::~TouchScreen() = default;

std::string TouchScreen::name() const {
    return libevdev_get_name(mDevice.get());
}

std::vector<frames::FingerRecord> TouchScreen::fingers() {
    const std::lock_guard<std::mutex> guard(mLock);
    takeEvents();
    return mIsLost ? std::vector<frames::FingerRecord>() : contactsOf(mDevice.get());
}

bool TouchScreen::isLost() {
    const std::lock_guard<std::mutex> guard(mLock);
    takeEvents();
    return mIsLost;
}

/// The kernel hands out whole reports only, so that what is there is one moment's.
void TouchScreen::takeEvents() {
    unsigned int mode = LIBEVDEV_READ_FLAG_NORMAL;
    while (!mIsLost) {
        input_event event{};
        const int status = libevdev_next_event(mDevice.get(), mode, &event);
        if (status == LIBEVDEV_READ_STATUS_SYNC) {
            // Some were lost because nobody read them; what they led to follows.
            mode = LIBEVDEV_READ_FLAG_SYNC;
        } else if (status == -EAGAIN && mode == LIBEVDEV_READ_FLAG_NORMAL) {
            return;
        } else if (status == -EAGAIN) {
            mode = LIBEVDEV_READ_FLAG_NORMAL;
        } else if (status < 0 && status != -EINTR) {
            mIsLost = true;
        }
    }
}

}  // namespace pemaro::simulator
