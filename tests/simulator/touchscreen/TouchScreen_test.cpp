// SPDX-License-Identifier: Apache-2.0
// What is no touch screen is told apart without one; over the kernel, tests/driver/TouchScreen_test.cpp.
#include "simulator/touchscreen/TouchScreen.h"

#include <gtest/gtest.h>

#include <string>

namespace pemaro::simulator {

TEST(TouchScreen, TellsWhatIsNone) {
    const struct {
        const char* path;
        const char* problem;
    } rows[] = {
            {"/dev/input/event4711", "cannot open /dev/input/event4711: No such file or directory"},
            {"/dev/null", "/dev/null is no input device: Inappropriate ioctl for device"},
            {"/tmp", "/tmp is no input device: Inappropriate ioctl for device"},
    };
    for (const auto& row : rows) {
        std::string problem;
        EXPECT_EQ(nullptr, TouchScreen::open(row.path, &problem));
        EXPECT_EQ(row.problem, problem);
    }
}

TEST(TouchScreen, IsNotAmongWhatIsNone) {
    EXPECT_TRUE(TouchScreen::list("/no/such/folder").empty());
    EXPECT_TRUE(TouchScreen::list("/dev").empty());
}

}  // namespace pemaro::simulator
