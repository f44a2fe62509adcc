// SPDX-License-Identifier: Apache-2.0
// Recorders, commands, gestures and hand events, some hundred clients, for as long as $ZELK_SOAK_SECONDS says,
// while clients and the service are stopped, continued and killed at random. What $ZELK_SOAK_SEED chose is
// printed. ./dev soak runs it.

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <memory>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include "tests/driver/DriverSetting.h"
#include "tests/driver/ProcessUsage.h"
#include "tests/driver/soak/SoakReport.h"

namespace pemaro::test {

namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using Clock = std::chrono::steady_clock;

constexpr int kRingFrames = 16;
constexpr seconds kRound(6);
constexpr int kLeastRounds = 2;  // one that the service survives, and one that it does not
// A client that was told to end, or whose service died. A virtual machine on a busy desk takes its time.
constexpr seconds kEndPatience(60);
// Binder's threads of the service come under load and stay, each with its stack and its part of the heap.
constexpr int kBinderThreads = 20;
constexpr int kLeewayKiB = 32 * 1024;

const std::vector<std::string> kRoles = {"recorder", "recorder", "recorder",  "watcher",  "watcher",
                                         "watcher",  "watcher",  "commander", "commander"};

uint64_t number(const char* variable, uint64_t otherwise) {
    const char* text = getenv(variable);
    return text == nullptr ? otherwise : strtoull(text, nullptr, 10);
}

int residentKiB(pid_t pid) {
    std::ifstream file("/proc/" + std::to_string(pid) + "/status");
    for (std::string line; std::getline(file, line);) {
        int size = 0;
        if (sscanf(line.c_str(), "VmRSS: %d", &size) == 1) {
            return size;
        }
    }
    return -1;
}

/// What the service told of a client's recordings, in turn.
struct Told {
    uint64_t produced;
    uint64_t dropped;
};

std::vector<Told> toldOf(const std::string& output, pid_t client) {
    std::vector<Told> told;
    const std::string format = "client " + std::to_string(client) +
                               " stopped: %lu frames, %lu without room in the ring";
    for (const std::string& line : splitLines(output)) {
        Told entry{};
        if (sscanf(line.c_str(), format.c_str(), &entry.produced, &entry.dropped) == 2) {
            told.push_back(entry);
        }
    }
    return told;
}

/// A client at work, and what it tells.
class Worker {
  public:
    Worker(const std::string& role, unsigned seed, const std::string& path)
            : mRole(role),
              mReport(mapSoakReport(path, true), &unmapSoakReport),
              mProcess({binary("soak-client"), role, std::to_string(seed), path}) {}

    const std::string& role() const { return mRole; }
    SoakReport& report() { return *mReport; }
    ChildProcess& process() { return mProcess; }

    /// False when it does nothing any more before it is at work.
    bool awaitReady() {
        uint64_t operations = 0;
        Clock::time_point end = Clock::now() + kEndPatience;
        while (mReport->ready == 0 && Clock::now() < end) {
            if (mReport->operations != operations) {
                operations = mReport->operations;
                end = Clock::now() + kEndPatience;
            }
            std::this_thread::sleep_for(milliseconds(10));
        }
        return mReport->ready != 0;
    }

    /// Told to end, it has to, whatever became of its service.
    void end() {
        mProcess.signal(SIGCONT);
        mProcess.signal(SIGTERM);
        EXPECT_NE(ChildProcess::kTimedOut, mProcess.wait(kEndPatience))
                << "a " << mRole << " does not end";
    }

    /// Every frame that was produced was delivered, or found no room and was counted, or lay in the ring
    /// when the recording ended. Only the recordings that a service was killed in go untold.
    void expectAccountedFor(const std::string& serviceOutput, bool serviceKilled) {
        EXPECT_STREQ("", mReport->problem) << mRole;
        const std::vector<Told> told = toldOf(serviceOutput, mProcess.pid());
        const size_t started = mReport->recordings;
        EXPECT_LE(told.size(), started + 1);
        if (!serviceKilled) {
            EXPECT_GE(told.size(), started);
        }
        for (size_t i = 0; i < std::min(told.size(), started); ++i) {
            const uint64_t received = mReport->recording[i].received;
            const uint64_t missing = mReport->recording[i].missing;
            const uint64_t written = told[i].produced - told[i].dropped;
            EXPECT_LE(missing, told[i].dropped) << "frames were lost that had room";
            EXPECT_LE(received, written);
            EXPECT_LE(written - received, uint64_t{kRingFrames}) << "frames were lost in the ring";
        }
    }

  private:
    const std::string mRole;
    const std::unique_ptr<SoakReport, decltype(&unmapSoakReport)> mReport;
    ChildProcess mProcess;
};

class Soak : public ::testing::Test {
  protected:
    void SetUp() override {
        char folder[] = "/tmp/zelk-soak-XXXXXX";
        ASSERT_NE(nullptr, mkdtemp(folder));
        mFolder = folder;
    }

    void TearDown() override {
        for (int i = 0; i < mFiles; ++i) {
            unlink(fileName(i).c_str());
        }
        rmdir(mFolder.c_str());
    }

    int upTo(int most) { return std::uniform_int_distribution<int>(0, most)(mRandom); }
    std::string fileName(int i) const { return mFolder + "/" + std::to_string(i); }

    std::unique_ptr<Worker> start(const std::string& role) {
        return std::make_unique<Worker>(role, mRandom(), fileName(mFiles++));
    }

    static void awaitAllReady(const std::vector<std::unique_ptr<Worker>>& workers) {
        for (const auto& worker : workers) {
            EXPECT_TRUE(worker->awaitReady()) << worker->role();
        }
    }

    /// Disturbs one process: most of them for some time, a client sometimes for ever.
    void disturb(std::vector<std::unique_ptr<Worker>>& workers,
                 std::vector<std::unique_ptr<Worker>>& killed, TouchStack& touchStack) {
        const auto which = static_cast<size_t>(upTo(static_cast<int>(workers.size())));
        ChildProcess& process =
                which == workers.size() ? touchStack.process() : workers[which]->process();
        if (which < workers.size() && upTo(3) == 0) {
            process.signal(SIGKILL);
            process.wait();
            killed.push_back(std::move(workers[which]));
            workers[which] = start(killed.back()->role());
            return;
        }
        process.signal(SIGSTOP);
        std::this_thread::sleep_for(milliseconds(upTo(500)));
        process.signal(SIGCONT);
    }

    void round(bool killService);

    std::mt19937 mRandom{static_cast<unsigned>(number("ZELK_SOAK_SEED", 1))};
    std::string mFolder;
    int mFiles = 0;
    uint64_t mOperations = 0;
    uint64_t mFrames = 0;
    uint64_t mEvents = 0;
    int mKilled = 0;
};

void Soak::round(bool killService) {
    TouchStack touchStack({"--rate", "200", "--ring-frames", std::to_string(kRingFrames),
                           "--gesture-rate", "0.5", "--hand-rate", "2"});
    const pid_t service = touchStack.process().pid();
    const ProcessUsage usageBefore(service);
    const int memoryBefore = residentKiB(service);
    std::vector<std::unique_ptr<Worker>> workers, killed;
    for (const std::string& role : kRoles) {
        workers.push_back(start(role));
    }
    awaitAllReady(workers);
    const Clock::time_point end = Clock::now() + kRound;
    while (Clock::now() < end) {
        std::this_thread::sleep_for(milliseconds(upTo(300)));
        disturb(workers, killed, touchStack);
    }
    if (killService) {
        // Who is still looking for its services would do that for the better part of a minute.
        awaitAllReady(workers);
        touchStack.kill();
    }
    for (const auto& worker : workers) {
        worker->end();
    }
    if (!killService) {
        // The killed clients' recordings end when the driver has told the service of their death.
        std::this_thread::sleep_for(seconds(3));
        const ProcessUsage usageAfter(service);
        EXPECT_LE(usageAfter.descriptors, usageBefore.descriptors + 2) << "rings were not closed";
        EXPECT_LE(usageAfter.threads, usageBefore.threads + kBinderThreads);
        EXPECT_LE(usageAfter.mappings, usageBefore.mappings + 4 * kBinderThreads);
        EXPECT_LE(residentKiB(service), memoryBefore + kLeewayKiB);
        touchStack.process().signal(SIGTERM);
        EXPECT_EQ(0, touchStack.process().wait());
    }
    mKilled += static_cast<int>(killed.size());
    const uint64_t framesBefore = mFrames;
    for (auto* some : {&workers, &killed}) {
        for (const auto& worker : *some) {
            worker->expectAccountedFor(touchStack.process().output(), killService);
            mOperations += worker->report().operations;
            mEvents += worker->report().events;
            for (uint32_t i = 0; i < worker->report().recordings; ++i) {
                mFrames += worker->report().recording[i].received;
            }
        }
    }
    EXPECT_GT(mFrames, framesBefore) << "nothing was recorded";
}

}  // namespace

TEST_F(Soak, AccountsForEveryFrameAndUsesUpNothing) {
    const Clock::time_point end = Clock::now() + seconds(number("ZELK_SOAK_SECONDS", 30));
    int rounds = 0;
    for (; (Clock::now() < end || rounds < kLeastRounds) && !HasFailure(); ++rounds) {
        round(rounds % 2 == 0);
        fprintf(stderr,
                "round %d: %lu operations, %lu frames, %lu events, %d clients killed so far\n",
                rounds + 1, mOperations, mFrames, mEvents, mKilled);
    }
    EXPECT_GT(mEvents, 0u);
}

}  // namespace pemaro::test
