// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <string>

#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

using Client = HandBiometricManagerClient;

struct ActivityOptions {
    bool stop = false;
    WatchOptions watch;
};

int act(const HandActivity& activity, const ActivityOptions& options) {
    const auto operateOnce = [&](const char* name, int (Client::*operation)(), const char* state) {
        return operate<HandManager>(
                name, [&](Client& client) { return (client.*operation)(); },
                fmt::format("{} {}", activity.done, state),
                JsonObject().add(activity.done, std::string(state)));
    };
    if (options.stop) {
        return operateOnce(activity.stopName, activity.stop, "stopped");
    }
    if (options.watch.isLimited()) {
        WatchSteps<Client> steps;
        steps.beginName = activity.startName;
        steps.begin = activity.start;
        steps.endName = activity.endName;
        steps.end = activity.end;
        return watchManager<HandManager>(options.watch, steps);
    }
    return operateOnce(activity.startName, activity.start, "started");
}

}  // namespace

void addHandActivityCommand(CLI::App& hand, Action& action, const HandActivity& activity) {
    auto options = std::make_shared<ActivityOptions>();
    Command command(hand, action, activity.name, activity.help);
    addWatchOptions(command, options->watch);
    addHandEventOption(command, options->watch);
    if (activity.stop != nullptr) {
        command.flag("--stop", options->stop, "End it instead")
                .excludes("--count", "--stop")
                .excludes("--seconds", "--stop");
    }
    command.details(
                   "With --count or --seconds the events are watched, and what still goes on then "
                   "is ended.")
            .check([options] {
                return options->watch.output.empty() || options->watch.isLimited()
                               ? ""
                               : "--output needs --count or --seconds";
            })
            .runs([options, activity] { return act(activity, *options); });
}

void addHandProfileCommand(CLI::App& hand, Action& action, const char* name, const char* help,
                           const char* operand, const char* operationName,
                           int (Client::*operation)(const char*), const char* done) {
    auto profile = std::make_shared<std::string>();
    Command(hand, action, name, help).operand(operand, *profile, "The profile's name").runs([=] {
        return operate<HandManager>(
                operationName,
                [&](Client& client) { return (client.*operation)(profile->c_str()); },
                fmt::format("profile {} {}", printable(*profile), done),
                JsonObject().add("profile", *profile).addFlag(done, true), printable(*profile));
    });
}

void addHandCommands(CLI::App& app, Action& action) {
    CLI::App& hand = addGroup(app, "hand", "Talk to the hand biometric manager");
    addHandEnrollCommand(hand, action);
    addHandScanCommand(hand, action);
    addHandMatchCommand(hand, action);
    addHandCancelCommand(hand, action);
    addHandSecurityCommand(hand, action);
    addHandProfilesCommand(hand, action);
    addHandNameCommand(hand, action);
    addHandRenameCommand(hand, action);
    addHandDeleteCommand(hand, action);
    addHandWakeupCommand(hand, action);
    addHandWatchCommand(hand, action);
}

}  // namespace pemaro::zelkctl
