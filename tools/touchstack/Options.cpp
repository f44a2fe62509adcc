// SPDX-License-Identifier: Apache-2.0
#include "tools/touchstack/Options.h"

#include <fmt/core.h>

#include <CLI/CLI.hpp>
#include <functional>
#include <set>
#include <string>
#include <vector>

#include "tools/common/CommandLine.h"
#include "tools/common/NearestWord.h"
#include "tools/common/Number.h"
#include "tools/touchstack/Source.h"

namespace pemaro::touchstack {

using simulator::Fault;
using simulator::ManagerOptions;
using simulator::ServiceKind;
using simulator::SimulatorOptions;

std::vector<std::string> serviceWords() {
    std::vector<std::string> words;
    for (const ServiceKind service : simulator::kServiceKinds) {
        words.emplace_back(simulator::shortName(service));
    }
    return words;
}

namespace {

/// What is wrong with a text, or nothing.
using Check = std::function<std::string(const std::string&)>;

/// Whole numbers of a range, and numbers with a fraction.
Check whole(int64_t least, int64_t most) {
    return [=](const std::string& text) { return tools::numberProblem(text, {least, most}); };
}

Check decimal(double least, double most) {
    return [=](const std::string& text) { return tools::decimalProblem(text, {least, most}); };
}

/// A number with a default, which the help tells.
template <typename Number>
CLI::Option* addNumber(CLI::App& app, const char* name, Number& number, const char* help,
                       const Check& check) {
    return app.add_option(name, number, help)
            ->type_name("NUMBER")
            ->check(check, "")
            ->capture_default_str();
}

void addCompanionOptions(CLI::App& app, CommandLine& line) {
    SimulatorOptions& options = line.options.companion;
    addNumber(app, "--rate", options.rate, "Frames a second; 0 is as fast as the client takes them",
              decimal(0, SimulatorOptions::kMaxRate));
    addNumber(app, "--frame-bytes", options.frameBytes, "Packet size in bytes",
              whole(SimulatorOptions::kMinFrameBytes, SimulatorOptions::kMaxFrameBytes));
    addNumber(app, "--ring-frames", options.ringFrames, "Frames that the shared ring holds",
              whole(1, SimulatorOptions::kMaxRingFrames));
    addNumber(app, "--remind", options.remindUs,
              "Microseconds after which a frame that was not taken is signalled again; 0 is "
              "never",
              whole(0, SimulatorOptions::kMaxRemindUs));
    addNumber(app, "--fingers", options.fingers, "Fingers on the panel",
              whole(0, SimulatorOptions::kMaxFingers));
    app.add_option("--config-file", options.configPath,
                   "Where the configuration is saved and reloaded when no path is told")
            ->type_name("FILE");
    app.add_option("--auth", options.authText, "What clients authenticate with")
            ->type_name("TEXT")
            ->capture_default_str();
    app.add_option("--fault", line.faultTexts,
                   "A fault to order, as OPERATION=status:NUMBER, OPERATION=delay:500ms, "
                   "OPERATION=die or getCblk=null; a manager's operation is touch.OPERATION, "
                   "gesture.OPERATION or hand.OPERATION; may be repeated")
            ->type_name("FAULT")
            ->allow_extra_args(false);
    app.add_flag("--log", line.showLog, "Show the platform's log lines");
    app.add_option("--services", line.serviceTexts,
                   "Serve only these: companion, touch, gesture, hand, separated by commas")
            ->type_name("SERVICES")
            ->delimiter(',')
            ->allow_extra_args(false);
}

void addSourceOptions(CLI::App& app, CommandLine& line) {
    SimulatorOptions& options = line.options.companion;
    CLI::Option* replay = app.add_option("--replay", line.replayPath,
                                         "A recording to play, bit for bit and at its own pace, "
                                         "instead of drawing frames");
    replay->type_name("FILE")->excludes("--rate")->excludes("--fingers");
    addNumber(app, "--speed", options.speed,
              "How fast to play it: 2 is twice as fast, 0 as fast as the client takes it",
              decimal(0, SimulatorOptions::kMaxSpeed))
            ->needs(replay);
    app.add_flag("--loop", options.loop, "Play it again and again")->needs(replay);
    app.add_option("--source", line.source,
                   "Whose fingers to draw instead of moving some: evdev:DEVICE, a touch screen of "
                   "this machine; list prints which there are, and exits")
            ->type_name("SOURCE")
            ->excludes(replay)
            ->excludes("--fingers")
            ->check(sourceProblem, "");
}

void addManagerOptions(CLI::App& app, ManagerOptions& options) {
    addNumber(app, "--gesture-rate", options.gestureRate,
              "Gestures a second of the touch and the gesture manager",
              decimal(0, ManagerOptions::kMaxRate));
    addNumber(app, "--hand-rate", options.handRate,
              "Steps a second of an enrollment, a scan or a matching",
              decimal(0, ManagerOptions::kMaxRate));
    addNumber(app, "--user-gestures", options.userGestures, "Gestures that can be defined",
              whole(0, ManagerOptions::kMaxUserGestures));
    addNumber(app, "--hand-profiles", options.handProfiles, "Hands that can be enrolled",
              whole(0, ManagerOptions::kMaxHandProfiles));
}

void readServices(const std::vector<std::string>& names, std::set<ServiceKind>& services) {
    if (!names.empty()) {
        services.clear();
    }
    for (const std::string& name : names) {
        const auto service = simulator::serviceKindOf(name);
        if (!service) {
            throw CLI::ValidationError("--services",
                                       fmt::format("there is no '{}'{}", name,
                                                   tools::nearestWordHint(name, serviceWords())));
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

/// Reads what the options cannot be asked for one by one, once they are parsed.
void readOptions(const CLI::App& app, CommandLine& line) {
    line.hasFrameBytes = app.count("--frame-bytes") != 0;
    readServices(line.serviceTexts, line.options.services);
    readFaults(line.faultTexts, line.faults);
    checkRing(line.options.companion);
}

}  // namespace

void addOptions(CLI::App& app, CommandLine& line) {
    app.name("zelk-touchstack");
    app.description(
            "A simulated touch stack that serves the touch companion and the touch, gesture "
            "and hand biometric managers over Binder until SIGINT or SIGTERM.");
    addCompanionOptions(app, line);
    addSourceOptions(app, line);
    addManagerOptions(app, line.options.managers);
}

std::optional<int> readCommandLine(int argc, char** argv, CommandLine& line) {
    CLI::App app;
    addOptions(app, line);
    return tools::parseCommandLine(app, argc, argv, [&] { readOptions(app, line); });
}

}  // namespace pemaro::touchstack
