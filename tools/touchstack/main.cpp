// SPDX-License-Identifier: Apache-2.0

/// zelk-touchstack: the simulated touch stack as a process of its own.

#include <binder/ProcessState.h>
#include <fmt/core.h>
#include <signal.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <chrono>
#include <cstdio>
#include <set>
#include <string>
#include <vector>

#include "simulator/TouchStack.h"
#include "simulator/companion/ReplayedFrames.h"
#include "tools/common/BinderDriver.h"
#include "tools/common/CommandLine.h"

using pemaro::simulator::Fault;
using pemaro::simulator::ManagerOptions;
using pemaro::simulator::Replay;
using pemaro::simulator::ServiceKind;
using pemaro::simulator::SimulatorOptions;
using pemaro::simulator::TouchStack;
using pemaro::tools::kExitFailure;
using pemaro::tools::kExitSuccess;

namespace {

struct CommandLine {
    TouchStack::Options options;
    std::string replayPath;
    bool hasFrameBytes = false;
    std::vector<Fault> faults;
    bool showLog = false;
};

int fail(const std::string& problem) {
    fmt::print(stderr, "zelk-touchstack: {}\n", problem);
    return kExitFailure;
}

/// The texts of a command line that are looked at when all are there.
struct Texts {
    std::vector<std::string> services;
    std::vector<std::string> faults;
};

void addOptions(CLI::App& app, CommandLine& line, Texts& texts) {
    SimulatorOptions& options = line.options.companion;
    app.add_option("--rate", options.rate, "Frames a second; 0 is as fast as the client takes them")
            ->check(CLI::Range(0.0, SimulatorOptions::kMaxRate))
            ->capture_default_str();
    app.add_option("--frame-bytes", options.frameBytes, "Packet size in bytes")
            ->check(CLI::Range(SimulatorOptions::kMinFrameBytes, SimulatorOptions::kMaxFrameBytes))
            ->capture_default_str();
    app.add_option("--ring-frames", options.ringFrames, "Frames that the shared ring holds")
            ->check(CLI::Range(1u, SimulatorOptions::kMaxRingFrames))
            ->capture_default_str();
    app.add_option("--remind", options.remindUs,
                   "Microseconds after which a frame that was not taken is signalled again; 0 is "
                   "never")
            ->check(CLI::Range(0u, SimulatorOptions::kMaxRemindUs))
            ->capture_default_str();
    app.add_option("--fingers", options.fingers, "Fingers on the panel")
            ->check(CLI::Range(0u, SimulatorOptions::kMaxFingers))
            ->capture_default_str();
    app.add_option("--config-file", options.configPath,
                   "Where the configuration is saved and reloaded when no path is told");
    app.add_option("--auth", options.authText, "What clients authenticate with")
            ->capture_default_str();
    app.add_option("--fault", texts.faults,
                   "A fault to order, as OPERATION=status:NUMBER, OPERATION=delay:500ms, "
                   "OPERATION=die or getCblk=null; a manager's operation is touch.OPERATION, "
                   "gesture.OPERATION or hand.OPERATION; may be repeated")
            ->allow_extra_args(false);
    app.add_flag("--log", line.showLog, "Show the platform's log lines");
    app.add_option("--services", texts.services,
                   "Serve only these: companion, touch, gesture, hand, separated by commas")
            ->delimiter(',')
            ->allow_extra_args(false);
}

void addReplayOptions(CLI::App& app, CommandLine& line) {
    SimulatorOptions& options = line.options.companion;
    CLI::Option* replay = app.add_option("--replay", line.replayPath,
                                         "A recording to play, bit for bit and at its own pace, "
                                         "instead of drawing frames");
    replay->excludes("--rate")->excludes("--fingers");
    app.add_option("--speed", options.speed,
                   "How fast to play it: 2 is twice as fast, 0 as fast as the client takes it")
            ->needs(replay)
            ->check(CLI::Range(0.0, SimulatorOptions::kMaxSpeed))
            ->capture_default_str();
    app.add_flag("--loop", options.loop, "Play it again and again")->needs(replay);
}

void addManagerOptions(CLI::App& app, ManagerOptions& options) {
    app.add_option("--gesture-rate", options.gestureRate,
                   "Gestures a second of the touch and the gesture manager")
            ->check(CLI::Range(0.0, ManagerOptions::kMaxRate))
            ->capture_default_str();
    app.add_option("--hand-rate", options.handRate,
                   "Steps a second of an enrollment, a scan or a matching")
            ->check(CLI::Range(0.0, ManagerOptions::kMaxRate))
            ->capture_default_str();
    app.add_option("--user-gestures", options.userGestures, "Gestures that can be defined")
            ->check(CLI::Range(0u, ManagerOptions::kMaxUserGestures))
            ->capture_default_str();
    app.add_option("--hand-profiles", options.handProfiles, "Hands that can be enrolled")
            ->check(CLI::Range(0u, ManagerOptions::kMaxHandProfiles))
            ->capture_default_str();
}

void readServices(const std::vector<std::string>& names, std::set<ServiceKind>& services) {
    if (!names.empty()) {
        services.clear();
    }
    for (const std::string& name : names) {
        const auto service = pemaro::simulator::serviceKindOf(name);
        if (!service) {
            throw CLI::ValidationError("--services", fmt::format("there is no '{}'", name));
        }
        services.insert(*service);
    }
}

void readFaults(const std::vector<std::string>& texts, std::vector<Fault>& faults) {
    for (const std::string& text : texts) {
        std::string problem;
        const auto fault = Fault::parse(text, &problem);
        if (!fault) {
            throw CLI::ValidationError("--fault", problem);
        }
        faults.push_back(*fault);
    }
}

void checkRing(const SimulatorOptions& options) {
    if (uint64_t{options.frameBytes} * options.ringFrames > SimulatorOptions::kMaxRingBytes) {
        throw CLI::ValidationError("--ring-frames",
                                   fmt::format("a ring may take {} MiB at most",
                                               SimulatorOptions::kMaxRingBytes >> 20));
    }
}

/// What is wrong with the recording to be played; empty when it is ready, or when there is none.
std::string openReplay(CommandLine& line) {
    SimulatorOptions& options = line.options.companion;
    if (line.replayPath.empty()) {
        return "";
    }
    std::string problem;
    options.replay = Replay::open(line.replayPath, &problem);
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
    fmt::print("replay      {}, {} frames of {:.3f} s, {}{}\n", line.replayPath,
               options.replay->frames(), seconds,
               options.speed > 0 ? fmt::format("speed {:g}", options.speed) : kUnpaced,
               options.loop ? ", again and again" : "");
    if (options.replay->leftOut() != 0) {
        fmt::print("left out    {} bytes that are no frame\n", options.replay->leftOut());
    }
    fmt::print("frames      {} bytes\n", options.frameBytes);
}

void describeDrawing(const SimulatorOptions& options) {
    const std::string rate =
            options.rate > 0 ? fmt::format("{:g} frames/s", options.rate) : std::string(kUnpaced);
    fmt::print("frames      {} bytes, {}, {} fingers\n", options.frameBytes, rate, options.fingers);
}

void describeFrames(const CommandLine& line) {
    const SimulatorOptions& options = line.options.companion;
    if (options.replay != nullptr) {
        describeReplay(line);
    } else {
        describeDrawing(options);
    }
    fmt::print("ring        {} frames, {} bytes\n", options.ringFrames,
               pemaro::kTouchCompanionRingOffset + size_t{options.frameBytes} * options.ringFrames);
    if (!options.configPath.empty()) {
        fmt::print("config      {}\n", options.configPath);
    }
}

void describe(const CommandLine& line) {
    const TouchStack::Options& options = line.options;
    for (const ServiceKind service : options.services) {
        fmt::print("serving     {}\n", pemaro::simulator::registeredName(service));
    }
    if (options.services.count(ServiceKind::kCompanion) != 0) {
        describeFrames(line);
    }
    fmt::print("events      {:g} gestures/s, {:g} hand steps/s\n", options.managers.gestureRate,
               options.managers.handRate);
    if (!line.faults.empty()) {
        fmt::print("faults      {}\n", line.faults.size());
    }
    fmt::print("process     {}\n", getpid());
    fflush(stdout);
}

sigset_t stopSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGINT);
    sigaddset(&signals, SIGTERM);
    return signals;
}

int serve(CommandLine& line) {
    // Blocked before the first thread is made, so that only sigwait below sees them.
    const sigset_t signals = stopSignals();
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    signal(SIGPIPE, SIG_IGN);

    const std::string problem = pemaro::tools::binderProblem();
    if (!problem.empty()) {
        return fail(problem);
    }
    line.options.companion.narrate = line.options.managers.narrate = [](const std::string& text) {
        fmt::print("{}\n", text);
        fflush(stdout);
    };
    TouchStack stack(line.options);
    for (const Fault& fault : line.faults) {
        stack.order(fault);
    }
    android::ProcessState::self()->startThreadPool();
    const std::string refusal = stack.registerAll();
    if (!refusal.empty()) {
        return fail(refusal);
    }
    describe(line);

    int received = 0;
    sigwait(&signals, &received);
    stack.shutDown();
    for (const std::string& text : stack.summary()) {
        fmt::print("{}\n", text);
    }
    return kExitSuccess;
}

}  // namespace

int main(int argc, char** argv) {
    CLI::App app(
            "A simulated touch stack that serves the touch companion and the touch, gesture "
            "and hand biometric managers over Binder until SIGINT or SIGTERM.",
            "zelk-touchstack");
    CommandLine line;
    Texts texts;
    addOptions(app, line, texts);
    addReplayOptions(app, line);
    addManagerOptions(app, line.options.managers);
    const auto done = pemaro::tools::parseCommandLine(app, argc, argv, [&] {
        readServices(texts.services, line.options.services);
        readFaults(texts.faults, line.faults);
        checkRing(line.options.companion);
    });
    if (done) {
        return *done;
    }
    line.hasFrameBytes = app.count("--frame-bytes") != 0;
    const std::string problem = openReplay(line);
    if (!problem.empty()) {
        return fail(problem);
    }
    pemaro::tools::showPlatformLog(line.showLog);
    pemaro::tools::leave(serve(line));
}
