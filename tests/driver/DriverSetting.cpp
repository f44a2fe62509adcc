// SPDX-License-Identifier: Apache-2.0
#include "tests/driver/DriverSetting.h"

#include "pemaro/Binder.h"

#include <binder/ProcessState.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <thread>

#include "tools/common/BinderDriver.h"

namespace pemaro::test {

namespace {

constexpr int kManagerTries = 300;
constexpr std::chrono::milliseconds kManagerPause(100);

class DriverEnvironment : public ::testing::Environment {
  public:
    void SetUp() override {
        ASSERT_EQ(0, access("/dev/binder", R_OK | W_OK))
                << "these tests need the Binder driver: run them with ./dev vm";
        // The driver takes a moment to forget the service manager of the program before.
        std::string problem;
        for (int i = 0; i < kManagerTries; ++i) {
            if (mManager == nullptr || !mManager->isRunning()) {
                mManager = std::make_unique<ChildProcess>(
                        std::vector<std::string>{platformBinary("servicemanager")});
            }
            std::this_thread::sleep_for(kManagerPause);
            problem = tools::binderProblem();
            if (problem.empty()) {
                android::ProcessState::self()->startThreadPool();
                return;
            }
        }
        FAIL() << problem << ": " << mManager->errors();
    }

    void TearDown() override { mManager.reset(); }

  private:
    std::unique_ptr<ChildProcess> mManager;
};

::testing::Environment* const gEnvironment =
        ::testing::AddGlobalTestEnvironment(new DriverEnvironment);

std::vector<std::string> touchStackCommand(const std::vector<std::string>& options) {
    std::vector<std::string> command = {binary("zelk-touchstack")};
    command.insert(command.end(), options.begin(), options.end());
    return command;
}

}  // namespace

std::string binary(const std::string& name) {
    return std::string(ZELK_BIN_DIR "/") + name;
}

std::string platformBinary(const std::string& name) {
    return std::string(ZELK_PLATFORM_BIN_DIR "/") + name;
}

TouchStack::TouchStack(const std::vector<std::string>& options)
        : mProcess(touchStackCommand(options)) {
    EXPECT_TRUE(mProcess.awaitOutput("process ")) << mProcess.errors();
}

void TouchStack::kill() {
    mProcess.signal(SIGKILL);
    EXPECT_EQ(128 + SIGKILL, mProcess.wait());
}

}  // namespace pemaro::test
