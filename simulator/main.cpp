// SPDX-License-Identifier: Apache-2.0

/// zelk-touchstack: the simulated touch stack as a process of its own.

#include <binder/IServiceManager.h>
#include <binder/ProcessState.h>
#include <fmt/core.h>
#include <signal.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <cstdio>
#include <string>
#include <vector>

#include "simulator/TouchCompanionSimulator.h"
#include "tools/common/BinderDriver.h"
#include "tools/common/CommandLine.h"

using pemaro::simulator::Fault;
using pemaro::simulator::SimulatorOptions;
using pemaro::simulator::TouchCompanionSimulator;
using pemaro::tools::kExitFailure;
using pemaro::tools::kExitSuccess;

namespace {

constexpr const char* kServiceName = "pemaro.TouchService";

struct CommandLine {
    SimulatorOptions options;
    std::vector<Fault> faults;
    bool showLog = false;
};

int fail(const std::string& problem) {
    fmt::print(stderr, "zelk-touchstack: {}\n", problem);
    return kExitFailure;
}

void addOptions(CLI::App& app, CommandLine& line, std::vector<std::string>& faults) {
    SimulatorOptions& options = line.options;
    app.add_option("--rate", options.rate, "Frames a second; 0 is as fast as the client takes them")
            ->check(CLI::Range(0.0, SimulatorOptions::kMaxRate))
            ->capture_default_str();
    app.add_option("--frame-bytes", options.frameBytes, "Packet size in bytes")
            ->check(CLI::Range(SimulatorOptions::kMinFrameBytes, SimulatorOptions::kMaxFrameBytes))
            ->capture_default_str();
    app.add_option("--ring-frames", options.ringFrames, "Frames that the shared ring holds")
            ->check(CLI::Range(1u, SimulatorOptions::kMaxRingFrames))
            ->capture_default_str();
    app.add_option("--fingers", options.fingers, "Fingers on the panel")
            ->check(CLI::Range(0u, SimulatorOptions::kMaxFingers))
            ->capture_default_str();
    app.add_option("--config-file", options.configPath,
                   "Where the configuration is saved and reloaded when no path is told");
    app.add_option("--auth", options.authText, "What clients authenticate with")
            ->capture_default_str();
    app.add_option("--fault", faults,
                   "A fault to order, as OPERATION=status:NUMBER, OPERATION=delay:500ms, "
                   "OPERATION=die or getCblk=null; may be repeated")
            ->allow_extra_args(false);
    app.add_flag("--log", line.showLog, "Show the platform's log lines");
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

void describe(const CommandLine& line) {
    const SimulatorOptions& options = line.options;
    const std::string rate = options.rate > 0 ? fmt::format("{:g} frames/s", options.rate)
                                              : std::string("as fast as they are taken");
    fmt::print("serving     {}\n", kServiceName);
    fmt::print("frames      {} bytes, {}, {} fingers\n", options.frameBytes, rate, options.fingers);
    fmt::print("ring        {} frames, {} bytes\n", options.ringFrames,
               pemaro::kTouchCompanionRingOffset + size_t{options.frameBytes} * options.ringFrames);
    if (!options.configPath.empty()) {
        fmt::print("config      {}\n", options.configPath);
    }
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
    line.options.narrate = [](const std::string& text) {
        fmt::print("{}\n", text);
        fflush(stdout);
    };
    android::sp<TouchCompanionSimulator> service = new TouchCompanionSimulator(line.options);
    for (const Fault& fault : line.faults) {
        service->faults().add(fault);
    }
    android::ProcessState::self()->startThreadPool();
    const android::status_t status =
            android::defaultServiceManager()->addService(android::String16(kServiceName), service);
    if (status != android::OK) {
        return fail(
                fmt::format("the service manager refused {}: {}", kServiceName, strerror(-status)));
    }
    describe(line);

    int received = 0;
    sigwait(&signals, &received);
    service->shutDown();
    const TouchCompanionSimulator::Totals totals = service->totals();
    fmt::print("stopped: {} recordings, {} frames, {} without room in the ring\n",
               totals.recordings, totals.produced, totals.dropped);
    return kExitSuccess;
}

}  // namespace

int main(int argc, char** argv) {
    CLI::App app("A simulated touch stack that serves " + std::string(kServiceName) +
                         " over Binder until SIGINT or SIGTERM.",
                 "zelk-touchstack");
    CommandLine line;
    std::vector<std::string> faults;
    addOptions(app, line, faults);
    const auto done = pemaro::tools::parseCommandLine(app, argc, argv, [&] {
        readFaults(faults, line.faults);
        checkRing(line.options);
    });
    if (done) {
        return *done;
    }
    pemaro::tools::showPlatformLog(line.showLog);
    pemaro::tools::leave(serve(line));
}
