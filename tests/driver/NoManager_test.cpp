// SPDX-License-Identifier: Apache-2.0
// The programs on a machine with the Binder driver and without a service manager.

#include <gtest/gtest.h>
#include <unistd.h>

#include <string>
#include <vector>

#include "tests/support/ChildProcess.h"

namespace pemaro::test {

TEST(NoServiceManager, IsToldAtOnceInOneLine) {
    ASSERT_EQ(0, access("/dev/binder", R_OK | W_OK))
            << "these tests need the Binder driver: run them with ./dev vm";
    const std::string folder = ZELK_BIN_DIR "/";
    const std::vector<std::vector<std::string>> commands = {
            {"zelk-touchstack"}, {"zelkctl", "ping"}, {"zelkctl", "record", "--frames", "1"}};
    for (std::vector<std::string> command : commands) {
        const std::string name = command[0];
        command[0] = folder + name;
        const RunResult result = run(command, std::chrono::seconds(10));
        EXPECT_EQ(1, result.status);
        EXPECT_EQ(name + ": no service manager is running\n", result.errors);
        EXPECT_EQ("", result.output);
    }
}

}  // namespace pemaro::test
