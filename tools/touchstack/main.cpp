// SPDX-License-Identifier: Apache-2.0

/// zelk-touchstack: the simulated touch stack as a process of its own.

#include <binder/ProcessState.h>
#include <fmt/core.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <utility>

#include "simulator/TouchStack.h"
#include "simulator/companion/ReplayedFrames.h"
#include "tools/common/BinderDriver.h"
#include "tools/common/CommandLine.h"
#include "tools/common/ProgressLine.h"
#include "tools/common/StandardOutput.h"
#include "tools/touchstack/Options.h"
#include "tools/touchstack/Registrar.h"
#include "tools/touchstack/Source.h"

using pemaro::simulator::Fault;
using pemaro::simulator::Replay;
using pemaro::simulator::ServiceKind;
using pemaro::simulator::SimulatorOptions;
using pemaro::simulator::TouchScreen;
using pemaro::simulator::TouchStack;
using pemaro::tools::kExitFailure;
using pemaro::tools::kExitSuccess;
using pemaro::touchstack::CommandLine;
using pemaro::touchstack::Registrar;

namespace {

/// How often the service manager and a source are looked after.
constexpr std::chrono::milliseconds kPeriod(500);
/// How long whoever does that may take to end.
constexpr std::chrono::milliseconds kGrace(800);

int fail(const std::string& problem, int status = kExitFailure) {
    pemaro::tools::writeError("zelk-touchstack: " + problem);
    return status;
}

/// Tells a line. When nobody can read it any more, that is said once, and the services go on.
void tell(const std::string& line) {
    static std::atomic<bool> told{false};
    if (!pemaro::tools::writeOutput(line + "\n") && !told.exchange(true)) {
        fail(pemaro::tools::outputProblem() + "; the services go on in silence");
    }
}

/// What is wrong with the recording to be played; empty when it is ready, or when there is none.
std::string openReplay(CommandLine& line) {
    SimulatorOptions& options = line.options.companion;
    if (line.replayPath.empty()) {
        return "";
    }
    std::string problem;
    {
        pemaro::tools::ProgressLine progress("reading", "bytes");
        options.replay =
                Replay::open(line.replayPath, &problem, [&](uint64_t done, uint64_t total) {
                    progress.step(done, total);
                    return true;
                });
    }
    if (options.replay == nullptr) {
        return problem;
    }
    const size_t longest = options.replay->longestFrame();
    if (!line.hasFrameBytes) {
        options.frameBytes = static_cast<uint32_t>(longest);
    }
    if (longest > std::min(options.frameBytes, SimulatorOptions::kMaxFrameBytes)) {
        return fmt::format("{} has a frame of {} bytes, too long for packets of {}",
                           line.replayPath, longest,
                           std::min(options.frameBytes, SimulatorOptions::kMaxFrameBytes));
    }
    return "";
}

const char* kUnpaced = "as fast as they are taken";

void describeReplay(const CommandLine& line) {
    const SimulatorOptions& options = line.options.companion;
    const double seconds = std::chrono::duration<double>(options.replay->duration()).count();
    tell(fmt::format("replay      {}, {} frames of {:.3f} s, {}{}", line.replayPath,
                     options.replay->frames(), seconds,
                     options.speed > 0 ? fmt::format("speed {:g}", options.speed) : kUnpaced,
                     options.loop ? ", again and again" : ""));
    if (options.replay->leftOut() != 0) {
        tell(fmt::format("left out    {} bytes that are no frame", options.replay->leftOut()));
    }
    tell(fmt::format("frames      {} bytes", options.frameBytes));
}

void describeDrawing(const SimulatorOptions& options) {
    if (options.touchScreen != nullptr) {
        tell("source      " + pemaro::touchstack::describeSource(*options.touchScreen));
    }
    const std::string rate =
            options.rate > 0 ? fmt::format("{:g} frames/s", options.rate) : std::string(kUnpaced);
    const std::string fingers = options.touchScreen == nullptr
                                        ? fmt::format("{} fingers", options.fingers)
                                        : "the source's fingers";
    tell(fmt::format("frames      {} bytes, {}, {}", options.frameBytes, rate, fingers));
}

void describeFrames(const CommandLine& line) {
    const SimulatorOptions& options = line.options.companion;
    if (options.replay != nullptr) {
        describeReplay(line);
    } else {
        describeDrawing(options);
    }
    tell(fmt::format(
            "ring        {} frames, {} bytes", options.ringFrames,
            pemaro::kTouchCompanionRingOffset + size_t{options.frameBytes} * options.ringFrames));
    if (!options.configPath.empty()) {
        tell("config      " + options.configPath);
    }
}

void describe(const CommandLine& line) {
    const TouchStack::Options& options = line.options;
    for (const ServiceKind service : options.services) {
        tell(fmt::format("serving     {}", pemaro::simulator::registeredName(service)));
    }
    if (options.services.count(ServiceKind::kCompanion) != 0) {
        describeFrames(line);
    }
    tell(fmt::format("events      {:g} gestures/s, {:g} hand steps/s", options.managers.gestureRate,
                     options.managers.handRate));
    if (!line.faults.empty()) {
        tell(fmt::format("faults      {}", line.faults.size()));
    }
    tell(fmt::format("process     {}", getpid()));
}

sigset_t stopSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGINT);
    sigaddset(&signals, SIGTERM);
    return signals;
}

/// Tells once that the touch screen whose fingers are drawn is gone.
class SourceWatch {
  public:
    explicit SourceWatch(std::shared_ptr<TouchScreen> screen) : mScreen(std::move(screen)) {}

    void check() {
        if (mScreen != nullptr && mScreen->isLost()) {
            tell(fmt::format("lost        {}; frames go on without fingers", mScreen->path()));
            mScreen.reset();
        }
    }

  private:
    std::shared_ptr<TouchScreen> mScreen;
};

/// The services, registered and looked after on a thread of their own: a service manager that hangs
/// keeps whoever asks it, and that must not be who waits for the signals.
class Server {
  public:
    explicit Server(const CommandLine& line) : mLine(line) {}

    /// Serves until end() is called; ends the process when that cannot be.
    void run() {
        const std::string problem = pemaro::tools::binderProblem();
        if (!problem.empty()) {
            pemaro::tools::leave(fail(problem, pemaro::tools::kExitAbsent));
        }
        TouchStack& stack = makeStack();
        android::ProcessState::self()->startThreadPool();
        const std::string refusal = stack.registerAll();
        if (!refusal.empty()) {
            pemaro::tools::leave(fail(refusal));
        }
        describe(mLine);

        Registrar registrar(stack.services(), tell);
        SourceWatch source(mLine.options.companion.touchScreen);
        while (!awaitEnd()) {
            registrar.check();
            source.check();
        }
        const std::lock_guard<std::mutex> guard(mLock);
        mHasEnded = true;
        mChanged.notify_all();
    }

    /// Ends the services, and tells what they have done.
    void end() {
        std::unique_lock<std::mutex> guard(mLock);
        mMustEnd = true;
        mChanged.notify_all();
        mChanged.wait_for(guard, kGrace, [this] { return mHasEnded; });
        if (mStack == nullptr) {
            return;
        }
        mStack->shutDown();
        for (const std::string& text : mStack->summary()) {
            tell(text);
        }
    }

  private:
    TouchStack& makeStack() {
        const std::lock_guard<std::mutex> guard(mLock);
        mStack = std::make_unique<TouchStack>(mLine.options);
        for (const Fault& fault : mLine.faults) {
            mStack->order(fault);
        }
        return *mStack;
    }

    /// Whether it is to end, before the time has come to look again.
    bool awaitEnd() {
        std::unique_lock<std::mutex> guard(mLock);
        return mChanged.wait_for(guard, kPeriod, [this] { return mMustEnd; });
    }

    const CommandLine& mLine;
    std::mutex mLock;
    std::condition_variable mChanged;
    bool mMustEnd = false;
    bool mHasEnded = false;
    std::unique_ptr<TouchStack> mStack;
};

[[noreturn]] void serve(CommandLine& line) {
    // Blocked before the first thread is made, so that only sigwait below sees them.
    const sigset_t signals = stopSignals();
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);

    line.options.companion.narrate = line.options.managers.narrate = tell;
    // It may hang in there when the process ends, and what it uses stays until then.
    Server server(line);
    std::thread([&server] { server.run(); }).detach();
    int signal = 0;
    sigwait(&signals, &signal);
    server.end();
    pemaro::tools::leave(pemaro::tools::outputProblem().empty() ? kExitSuccess : kExitFailure);
}

}  // namespace

int main(int argc, char** argv) {
    pemaro::tools::openStandardStreams();
    signal(SIGPIPE, SIG_IGN);
    if (!pemaro::tools::outputProblem().empty()) {
        pemaro::tools::leave(fail(pemaro::tools::outputProblem()));
    }
    CommandLine line;
    if (const auto done = pemaro::touchstack::readCommandLine(argc, argv, line)) {
        return *done;
    }
    if (line.source == "list") {
        return pemaro::touchstack::listSources();
    }
    std::string problem = openReplay(line);
    if (problem.empty()) {
        line.options.companion.touchScreen = pemaro::touchstack::openSource(line.source, &problem);
    }
    if (!problem.empty()) {
        return fail(problem);
    }
    pemaro::tools::showPlatformLog(line.showLog);
    serve(line);
}
