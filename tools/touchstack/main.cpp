// SPDX-License-Identifier: Apache-2.0

/// zelk-touchstack: the simulated touch stack as a process of its own.

#include <binder/ProcessState.h>
#include <fmt/core.h>
#include <signal.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <atomic>
#include <chrono>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "simulator/TouchStack.h"
#include "simulator/companion/ReplayedFrames.h"
#include "tools/common/BinderDriver.h"
#include "tools/common/CommandLine.h"
#include "tools/common/NearestWord.h"
#include "tools/common/Number.h"
#include "tools/common/StandardOutput.h"
#include "tools/touchstack/Registrar.h"
#include "tools/touchstack/Source.h"

using pemaro::simulator::Fault;
using pemaro::simulator::ManagerOptions;
using pemaro::simulator::Replay;
using pemaro::simulator::ServiceKind;
using pemaro::simulator::SimulatorOptions;
using pemaro::simulator::TouchScreen;
using pemaro::simulator::TouchStack;
using pemaro::tools::kExitFailure;
using pemaro::tools::kExitSuccess;
using pemaro::touchstack::Registrar;

namespace {

/// How often the service manager and a source are looked after.
constexpr timespec kPeriod{0, 500000000};

struct CommandLine {
    TouchStack::Options options;
    std::string replayPath;
    std::string source;
    bool hasFrameBytes = false;
    std::vector<Fault> faults;
    bool showLog = false;
};

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

/// The texts of a command line that are looked at when all are there.
struct Texts {
    std::vector<std::string> services;
    std::vector<std::string> faults;
};

/// Whole numbers of a range, and numbers with a fraction.
std::function<std::string(const std::string&)> whole(int64_t least, int64_t most) {
    return [=](const std::string& text) {
        return pemaro::tools::numberProblem(text, {least, most});
    };
}

std::function<std::string(const std::string&)> decimal(double least, double most) {
    return [=](const std::string& text) {
        return pemaro::tools::decimalProblem(text, {least, most});
    };
}

void addOptions(CLI::App& app, CommandLine& line, Texts& texts) {
    SimulatorOptions& options = line.options.companion;
    app.add_option("--rate", options.rate, "Frames a second; 0 is as fast as the client takes them")
            ->check(decimal(0, SimulatorOptions::kMaxRate), "")
            ->capture_default_str();
    app.add_option("--frame-bytes", options.frameBytes, "Packet size in bytes")
            ->check(whole(SimulatorOptions::kMinFrameBytes, SimulatorOptions::kMaxFrameBytes), "")
            ->capture_default_str();
    app.add_option("--ring-frames", options.ringFrames, "Frames that the shared ring holds")
            ->check(whole(1, SimulatorOptions::kMaxRingFrames), "")
            ->capture_default_str();
    app.add_option("--remind", options.remindUs,
                   "Microseconds after which a frame that was not taken is signalled again; 0 is "
                   "never")
            ->check(whole(0, SimulatorOptions::kMaxRemindUs), "")
            ->capture_default_str();
    app.add_option("--fingers", options.fingers, "Fingers on the panel")
            ->check(whole(0, SimulatorOptions::kMaxFingers), "")
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

void addSourceOptions(CLI::App& app, CommandLine& line) {
    SimulatorOptions& options = line.options.companion;
    CLI::Option* replay = app.add_option("--replay", line.replayPath,
                                         "A recording to play, bit for bit and at its own pace, "
                                         "instead of drawing frames");
    replay->excludes("--rate")->excludes("--fingers");
    app.add_option("--speed", options.speed,
                   "How fast to play it: 2 is twice as fast, 0 as fast as the client takes it")
            ->needs(replay)
            ->check(decimal(0, SimulatorOptions::kMaxSpeed), "")
            ->capture_default_str();
    app.add_flag("--loop", options.loop, "Play it again and again")->needs(replay);
    app.add_option("--source", line.source,
                   "Whose fingers to draw instead of moving some: evdev:DEVICE, a touch screen of "
                   "this machine; list prints which there are, and exits")
            ->excludes(replay)
            ->excludes("--fingers")
            ->check(pemaro::touchstack::sourceProblem, "");
}

void addManagerOptions(CLI::App& app, ManagerOptions& options) {
    app.add_option("--gesture-rate", options.gestureRate,
                   "Gestures a second of the touch and the gesture manager")
            ->check(decimal(0, ManagerOptions::kMaxRate), "")
            ->capture_default_str();
    app.add_option("--hand-rate", options.handRate,
                   "Steps a second of an enrollment, a scan or a matching")
            ->check(decimal(0, ManagerOptions::kMaxRate), "")
            ->capture_default_str();
    app.add_option("--user-gestures", options.userGestures, "Gestures that can be defined")
            ->check(whole(0, ManagerOptions::kMaxUserGestures), "")
            ->capture_default_str();
    app.add_option("--hand-profiles", options.handProfiles, "Hands that can be enrolled")
            ->check(whole(0, ManagerOptions::kMaxHandProfiles), "")
            ->capture_default_str();
}

std::vector<std::string> serviceWords() {
    std::vector<std::string> words;
    for (const ServiceKind service : pemaro::simulator::kServiceKinds) {
        words.emplace_back(pemaro::simulator::shortName(service));
    }
    return words;
}

void readServices(const std::vector<std::string>& names, std::set<ServiceKind>& services) {
    if (!names.empty()) {
        services.clear();
    }
    for (const std::string& name : names) {
        const auto service = pemaro::simulator::serviceKindOf(name);
        if (!service) {
            throw CLI::ValidationError("--services", fmt::format("there is no '{}'{}", name,
                                                                 pemaro::tools::nearestWordHint(
                                                                         name, serviceWords())));
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

int serve(CommandLine& line) {
    // Blocked before the first thread is made, so that only sigtimedwait below sees them.
    const sigset_t signals = stopSignals();
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);

    const std::string problem = pemaro::tools::binderProblem();
    if (!problem.empty()) {
        return fail(problem, pemaro::tools::kExitAbsent);
    }
    line.options.companion.narrate = line.options.managers.narrate = tell;
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

    Registrar registrar(stack.services(), tell);
    SourceWatch source(line.options.companion.touchScreen);
    while (sigtimedwait(&signals, nullptr, &kPeriod) < 0) {
        registrar.check();
        source.check();
    }
    stack.shutDown();
    for (const std::string& text : stack.summary()) {
        tell(text);
    }
    return pemaro::tools::outputProblem().empty() ? kExitSuccess : kExitFailure;
}

}  // namespace

int main(int argc, char** argv) {
    pemaro::tools::openStandardStreams();
    signal(SIGPIPE, SIG_IGN);
    if (!pemaro::tools::outputProblem().empty()) {
        pemaro::tools::leave(fail(pemaro::tools::outputProblem()));
    }
    CLI::App app(
            "A simulated touch stack that serves the touch companion and the touch, gesture "
            "and hand biometric managers over Binder until SIGINT or SIGTERM.",
            "zelk-touchstack");
    CommandLine line;
    Texts texts;
    addOptions(app, line, texts);
    addSourceOptions(app, line);
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
    pemaro::tools::leave(serve(line));
}
