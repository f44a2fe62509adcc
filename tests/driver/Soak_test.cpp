// SPDX-License-Identifier: Apache-2.0
// Recorders, commands, gestures and hand events, some hundred clients, for as long as $ZELK_SOAK_SECONDS says,
// while clients and the service are stopped, continued and killed at random. In each second round the service dies
// at some moment of it, and another takes its place. What $ZELK_SOAK_SEED chose is printed. ./dev soak runs it.

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
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
// Binder's threads come under load and stay, each with its stack and its part of the heap: as many as the
// platform lets there be, the first two of which were there before.
constexpr int kBinderThreads = 15;
// Of threads that have ended, a recording's for one, the C library keeps five stacks (40 MiB), each with its
// guard.
constexpr int kKeptStackMappings = 2 * 5;
constexpr int kLeewayKiB = 16 * 1024;

const std::vector<std::string> kRoles = {"recorder", "recorder", "recorder",  "watcher",  "watcher",
                                         "watcher",  "watcher",  "commander", "commander"};

uint64_t number(const char* variable, uint64_t otherwise) {
    const char* text = getenv(variable);
    return text == nullptr ? otherwise : strtoull(text, nullptr, 10);
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

    bool isRunning() { return mProcess.isRunning(); }

    /// Told to end, it has to, whatever became of its service.
    void end() {
        mProcess.signal(SIGCONT);
        mProcess.signal(SIGTERM);
        EXPECT_NE(ChildProcess::kTimedOut, mProcess.wait(kEndPatience))
                << "a " << mRole << " does not end";
    }

    /// At its end it used no more than when it began to work, but for the threads of Binder's that have
    /// come. A recording thread that stands in a wait of a service's death keeps its ring, and is told of.
    void expectNothingUsedUp() {
        const SoakUsage& before = mReport->atWork;
        const SoakUsage& after = mReport->afterwards;
        if (mReport->ready == 0 || after.descriptors == 0) {
            return;
        }
        int leftBehind = 0;
        for (const std::string& line : splitLines(mProcess.errors())) {
            leftBehind += line.find("recording thread is left behind") != std::string::npos ? 1 : 0;
        }
        EXPECT_LE(after.descriptors, before.descriptors + leftBehind) << mRole;
        EXPECT_LE(after.threads, before.threads + kBinderThreads + leftBehind) << mRole;
        EXPECT_LE(after.mappings,
                  before.mappings + 4 * (kBinderThreads + leftBehind) + kKeptStackMappings)
                << mRole;
        EXPECT_LE(after.memoryKiB, before.memoryKiB + kLeewayKiB) << mRole;
    }

    /// Every frame that was produced was delivered, or found no room and was counted, or lay in the ring
    /// when the recording ended. That nothing in the ring was left out the client has seen by the ring's
    /// index, also of a recording that ended untold: the one in which its service was killed.
    void expectAccountedFor(const std::string& serviceOutput, bool serviceKilled) {
        EXPECT_STREQ("", mReport->problem) << mRole;
        const std::vector<Told> told = toldOf(serviceOutput, mProcess.pid());
        const size_t started = mReport->recordings;
        EXPECT_LE(told.size(), started + 1);
        EXPECT_GE(told.size() + (serviceKilled ? 1 : 0), started);
        for (size_t i = 0; i < started; ++i) {
            const uint64_t received = mReport->recording[i].received;
            const uint64_t written = mReport->recording[i].written;
            EXPECT_LE(received, written);
            EXPECT_LE(written - received, uint64_t{kRingFrames}) << "frames were lost in the ring";
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

    /// In place of those that have ended with their service.
    void replaceEnded(std::vector<std::unique_ptr<Worker>>& workers,
                      std::vector<std::unique_ptr<Worker>>& gone) {
        for (auto& worker : workers) {
            if (!worker->isRunning()) {
                gone.push_back(std::move(worker));
                worker = start(gone.back()->role());
            }
        }
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

/// A service, and what it used when it had started.
struct Service {
    TouchStack stack{{"--rate", "200", "--ring-frames", std::to_string(kRingFrames),
                      "--gesture-rate", "0.5", "--hand-rate", "2"}};
    const ProcessUsage before{stack.process().pid()};
};

void Soak::round(bool killService) {
    auto service = std::make_unique<Service>();
    std::string output;  // of the one that was killed
    std::vector<std::unique_ptr<Worker>> workers, killed, ended;
    for (const std::string& role : kRoles) {
        workers.push_back(start(role));
    }
    awaitAllReady(workers);
    const Clock::time_point end = Clock::now() + kRound;
    const Clock::time_point deathAt =
            Clock::now() + milliseconds(upTo(static_cast<int>(milliseconds(kRound).count())));
    while (Clock::now() < end) {
        std::this_thread::sleep_for(milliseconds(upTo(300)));
        disturb(workers, killed, service->stack);
        if (killService && output.empty() && Clock::now() >= deathAt) {
            service->stack.kill();
            output = service->stack.process().output();
            service = std::make_unique<Service>();
        }
        replaceEnded(workers, ended);
    }
    for (const auto& worker : workers) {
        worker->end();
    }
    // The killed clients' recordings end when the driver has told the service of their death.
    std::this_thread::sleep_for(seconds(3));
    const ProcessUsage after(service->stack.process().pid());
    EXPECT_LE(after.descriptors, service->before.descriptors + 2) << "rings were not closed";
    EXPECT_LE(after.threads, service->before.threads + kBinderThreads);
    EXPECT_LE(after.mappings, service->before.mappings + 4 * kBinderThreads + kKeptStackMappings);
    EXPECT_LE(after.memoryKiB, service->before.memoryKiB + kLeewayKiB);
    service->stack.process().signal(SIGTERM);
    EXPECT_EQ(0, service->stack.process().wait());
    output += service->stack.process().output();

    mKilled += static_cast<int>(killed.size());
    const uint64_t framesBefore = mFrames;
    for (auto* some : {&workers, &killed, &ended}) {
        for (const auto& worker : *some) {
            worker->expectNothingUsedUp();
            worker->expectAccountedFor(output, killService);
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
