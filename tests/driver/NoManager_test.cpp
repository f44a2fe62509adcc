// SPDX-License-Identifier: Apache-2.0
// The programs on a machine with the Binder driver and without a service manager.

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <memory>
#include <string>
#include <thread>
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
        EXPECT_EQ(3, result.status);
        EXPECT_EQ(name + ": no service manager is running\n", result.errors);
        EXPECT_EQ("", result.output);
    }
}

// The service manager of a desk is a program like any other.
TEST(ServiceManager, ThatIsNewLearnsOfTheServices) {
    const std::string folder = ZELK_BIN_DIR "/";
    auto manager = std::make_unique<ChildProcess>(
            std::vector<std::string>{ZELK_PLATFORM_BIN_DIR "/servicemanager"});
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    ChildProcess stack({folder + "zelk-touchstack", "--gesture-rate", "0"});
    ASSERT_TRUE(stack.awaitOutput("process "));
    EXPECT_EQ(0, run({folder + "zelkctl", "ping"}).status);

    manager.reset();
    EXPECT_TRUE(stack.awaitOutput("the service manager died; nobody new finds the services\n"));
    EXPECT_EQ(3, run({folder + "zelkctl", "ping"}).status);
    manager = std::make_unique<ChildProcess>(
            std::vector<std::string>{ZELK_PLATFORM_BIN_DIR "/servicemanager"});
    EXPECT_TRUE(stack.awaitOutput("registered again with the new service manager\n"));
    EXPECT_EQ(0, run({folder + "zelkctl", "ping"}).status);
    EXPECT_EQ(0, run({folder + "zelkctl", "gesture", "limits"}).status);
    stack.signal(SIGTERM);
    EXPECT_EQ(0, stack.wait());
}

TEST(ServiceManager, ThatHangsKeepsNobodyFromEndingTheServices) {
    ChildProcess manager({ZELK_PLATFORM_BIN_DIR "/servicemanager"});
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    const std::string program = ZELK_BIN_DIR "/zelk-touchstack";
    for (const int signal : {SIGINT, SIGTERM}) {
        ChildProcess registered({program, "--gesture-rate", "0"});
        ASSERT_TRUE(registered.awaitOutput("process "));
        manager.signal(SIGSTOP);
        ChildProcess unknown({program, "--gesture-rate", "0"});
        // Until both wait for the service manager.
        std::this_thread::sleep_for(std::chrono::seconds(1));
        for (ChildProcess* stack : {&registered, &unknown}) {
            stack->signal(signal);
            EXPECT_EQ(0, stack->wait(std::chrono::seconds(10)));
            EXPECT_EQ("", stack->errors());
        }
        EXPECT_NE(std::string::npos, registered.output().find("stopped: 0 recordings, "));
        EXPECT_EQ("", unknown.output());
        manager.signal(SIGCONT);
    }
}

}  // namespace pemaro::test
