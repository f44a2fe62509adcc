// SPDX-License-Identifier: Apache-2.0
// zelk-touchstack --source: the fingers of a touch screen, which the kernel makes of what the test says,
// arrive in the frames of a client.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <libevdev/libevdev-uinput.h>
#include <libevdev/libevdev.h>
#include <unistd.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include "frames/FrameContent.h"
#include "frames/RecordingFile.h"
#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tests/support/DescribedDevice.h"

using testing::HasSubstr;

namespace pemaro::test {

namespace {

constexpr Event kReport{EV_SYN, SYN_REPORT, 0};

// An input device of the kernel's that does as it is told.
class InputDevice {
  public:
    InputDevice(const char* name, const std::vector<Range>& axes,
                const std::vector<unsigned int>& keys) {
        const DescribedDevice device = DescribedDevice(axes, keys).named(name);
        libevdev_uinput* made = nullptr;
        const int failure = libevdev_uinput_create_from_device(device.get(),
                                                               LIBEVDEV_UINPUT_OPEN_MANAGED, &made);
        EXPECT_EQ(0, failure) << strerror(-failure);
        mDevice.reset(made);
    }

    std::string path() const { return libevdev_uinput_get_devnode(mDevice.get()); }
    std::string source() const { return "evdev:" + path(); }

    // The kernel tells of a whole report at once.
    void report(const std::vector<Event>& events) {
        for (const Event& event : events) {
            EXPECT_EQ(0, libevdev_uinput_write_event(mDevice.get(), event.type, event.code,
                                                     event.value));
        }
        libevdev_uinput_write_event(mDevice.get(), kReport.type, kReport.code, kReport.value);
    }

    void touch(int slot, int contact, int x, int y) {
        report({{EV_ABS, ABS_MT_SLOT, slot},
                {EV_ABS, ABS_MT_TRACKING_ID, contact},
                {EV_ABS, ABS_MT_POSITION_X, x},
                {EV_ABS, ABS_MT_POSITION_Y, y}});
    }

    void lift(int slot) { report({{EV_ABS, ABS_MT_SLOT, slot}, {EV_ABS, ABS_MT_TRACKING_ID, -1}}); }

    void unplug() { mDevice.reset(); }

  private:
    std::unique_ptr<libevdev_uinput, void (*)(libevdev_uinput*)> mDevice{nullptr,
                                                                         libevdev_uinput_destroy};
};

InputDevice touchScreen(const char* name = "test panel") {
    return {name,
            {{ABS_MT_SLOT, 0, 9},
             {ABS_MT_TRACKING_ID, 0, 65535},
             {ABS_MT_POSITION_X, 0, 1080},
             {ABS_MT_POSITION_Y, 0, 2400}},
            {}};
}

struct Seen {
    int finger;
    int x;
    int y;

    bool operator==(const Seen& other) const {
        return finger == other.finger && x == other.x && y == other.y;
    }
};

std::ostream& operator<<(std::ostream& out, const Seen& seen) {
    return out << seen.finger << " at " << seen.x << ", " << seen.y;
}

class TouchScreenSource : public ::testing::Test {
  protected:
    void SetUp() override {
        if (access("/dev/uinput", W_OK) != 0) {
            GTEST_SKIP() << "this kernel makes no input devices: there is no /dev/uinput to write";
        }
    }

    // The last of some frames that a client records now.
    frames::FrameContent recordFrame() {
        const RunResult record =
                zelkctl({"record", "--frames", "5", "--output", files.path("frames")});
        EXPECT_EQ(0, record.status) << record.errors;
        std::string problem;
        const auto file = frames::RecordingFile::open(files.path("frames"), &problem);
        EXPECT_NE(nullptr, file) << problem;
        EXPECT_EQ(5u, file->parts().size());
        return frames::readFrameContent(file->bytes(file->parts().back()));
    }

    // The fingers of such a frame, each of which is the hottest place around it.
    std::vector<Seen> recordFingers() {
        const frames::FrameContent frame = recordFrame();
        std::vector<Seen> fingers;
        for (const frames::FingerRecord& finger : frame.fingers) {
            fingers.push_back({finger.id, finger.x, finger.y});
            const int column = (finger.x * (frame.header.columns - 1) + 32767) / 65535;
            const int row = (finger.y * (frame.header.rows - 1) + 32767) / 65535;
            const int pressed = cell(frame, row, column);
            EXPECT_GT(pressed, finger.peak / 2);
            for (const int across : {-2, 2}) {
                EXPECT_GT(pressed, cell(frame, row, column + across));
                EXPECT_GT(pressed, cell(frame, row + across, column));
            }
        }
        return fingers;
    }

    // Outside of the image nothing is pressed.
    static int cell(const frames::FrameContent& frame, int row, int column) {
        const bool isInside =
                row >= 0 && row < frame.header.rows && column >= 0 && column < frame.header.columns;
        return isInside ? frame.image[static_cast<size_t>(row * frame.header.columns + column)] : 0;
    }

    Files files;
};

}  // namespace

TEST_F(TouchScreenSource, OfSeveralFingersIsDrawn) {
    InputDevice screen = touchScreen();
    TouchStack stack({"--source", screen.source()});
    EXPECT_THAT(stack.process().output(),
                HasSubstr("source      " + screen.path() + ", test panel, 10 fingers\n"));
    EXPECT_EQ((std::vector<Seen>{}), recordFingers());
    const std::vector<int16_t> image = recordFrame().image;
    EXPECT_EQ(0, *std::max_element(image.begin(), image.end()));

    screen.touch(0, 100, 0, 0);
    screen.touch(2, 101, 540, 1200);
    EXPECT_EQ((std::vector<Seen>{{0, 0, 0}, {2, 32768, 32768}}), recordFingers());

    screen.lift(0);
    screen.touch(2, 101, 1080, 600);
    EXPECT_EQ((std::vector<Seen>{{2, 65535, 16384}}), recordFingers());

    screen.lift(2);
    EXPECT_EQ((std::vector<Seen>{}), recordFingers());
}

TEST_F(TouchScreenSource, OfOneFingerIsDrawn) {
    InputDevice screen("one finger", {{ABS_X, 100, 3900}, {ABS_Y, 100, 3900}}, {BTN_TOUCH});
    TouchStack stack({"--source", screen.source()});
    EXPECT_THAT(stack.process().output(), HasSubstr(", one finger, 1 fingers\n"));
    screen.report({{EV_ABS, ABS_X, 2000}, {EV_ABS, ABS_Y, 3900}});
    EXPECT_EQ((std::vector<Seen>{}), recordFingers());
    screen.report({{EV_KEY, BTN_TOUCH, 1}});
    EXPECT_EQ((std::vector<Seen>{{0, 32768, 65535}}), recordFingers());
    screen.report({{EV_KEY, BTN_TOUCH, 0}});
    EXPECT_EQ((std::vector<Seen>{}), recordFingers());
}

TEST_F(TouchScreenSource, KnowsWhatIsTouchedAfterMoreThanTheKernelKeeps) {
    InputDevice screen = touchScreen();
    TouchStack stack({"--source", screen.source()});
    for (int i = 0; i < 20000; ++i) {
        screen.touch(i % 10, i, i % 1081, i % 2401);
    }
    for (int slot = 0; slot < 9; ++slot) {
        screen.lift(slot);
    }
    screen.touch(9, 20000, 1080, 2400);
    EXPECT_EQ((std::vector<Seen>{{9, 65535, 65535}}), recordFingers());
}

TEST_F(TouchScreenSource, IsDrawnForEachClientAndThroughTheFilter) {
    InputDevice screen = touchScreen();
    TouchStack stack({"--source", screen.source(), "--rate", "0"});
    screen.touch(0, 1, 540, 1200);
    ChildProcess other({binary("zelkctl"), "record", "--seconds", "3", "-o", files.path("other")});
    EXPECT_EQ((std::vector<Seen>{{0, 32768, 32768}}), recordFingers());
    ASSERT_EQ(0, zelkctl({"filter", "1"}).status);
    EXPECT_EQ(0, recordFrame().header.fingers);
    EXPECT_LT(1000, cell(recordFrame(), 30, 16));
    EXPECT_EQ(0, other.wait());
}

TEST_F(TouchScreenSource, ThatIsLostIsToldAndLeavesTheFramesWithoutFingers) {
    InputDevice screen = touchScreen();
    TouchStack stack({"--source", screen.source()});
    screen.touch(0, 1, 540, 1200);
    EXPECT_EQ(1u, recordFingers().size());
    const std::string path = screen.path();
    screen.unplug();
    EXPECT_TRUE(stack.awaitLine("lost        " + path + "; frames go on without fingers"));
    EXPECT_EQ((std::vector<Seen>{}), recordFingers());
    EXPECT_TRUE(stack.process().isRunning());
}

TEST_F(TouchScreenSource, IsListed) {
    EXPECT_EQ("", run({binary("zelk-touchstack"), "--source", "list"}).output);
    const InputDevice keyboard("test keyboard", {}, {KEY_A});
    const InputDevice screen = touchScreen("first");
    const InputDevice other = touchScreen("second");
    const RunResult list = run({binary("zelk-touchstack"), "--source", "list"});
    EXPECT_EQ(0, list.status);
    EXPECT_EQ(screen.source() + "  first, 10 fingers\n" + other.source() + "  second, 10 fingers\n",
              list.output);
    EXPECT_EQ("", list.errors);
}

TEST_F(TouchScreenSource, ThatIsNoTouchScreenIsRefused) {
    const InputDevice keyboard("test keyboard", {}, {KEY_A});
    const RunResult result = run({binary("zelk-touchstack"), "--source", keyboard.source()});
    EXPECT_EQ(1, result.status);
    EXPECT_EQ("", result.output);
    EXPECT_EQ("zelk-touchstack: " + keyboard.path() +
                      " (test keyboard) is no touch screen: it tells no positions\n",
              result.errors);
}

}  // namespace pemaro::test
