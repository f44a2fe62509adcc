// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>
#include <libevdev/libevdev.h>

#include <memory>
#include <utility>
#include <vector>

namespace pemaro::test {

/// An axis of an input device, as ABS_X.
struct Range {
    unsigned int code;
    int least;
    int most;
};

struct Event {
    unsigned int type;
    unsigned int code;
    int value;
};

/// An input device as the kernel would describe it, without one.
class DescribedDevice {
  public:
    DescribedDevice(const std::vector<Range>& axes, const std::vector<unsigned int>& keys = {}) {
        for (const Range& axis : axes) {
            const input_absinfo info{0, axis.least, axis.most, 0, 0, 0};
            libevdev_enable_event_code(mDevice.get(), EV_ABS, axis.code, &info);
        }
        for (const unsigned int key : keys) {
            libevdev_enable_event_code(mDevice.get(), EV_KEY, key, nullptr);
        }
    }

    DescribedDevice with(unsigned int property) && {
        libevdev_enable_property(mDevice.get(), property);
        return std::move(*this);
    }

    DescribedDevice named(const char* name) && {
        libevdev_set_name(mDevice.get(), name);
        return std::move(*this);
    }

    void take(const std::vector<Event>& events) {
        for (const Event& event : events) {
            EXPECT_EQ(0,
                      libevdev_set_event_value(mDevice.get(), event.type, event.code, event.value))
                    << event.code;
        }
    }

    const libevdev* get() const { return mDevice.get(); }

  private:
    std::unique_ptr<libevdev, void (*)(libevdev*)> mDevice{libevdev_new(), libevdev_free};
};

}  // namespace pemaro::test
