// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <string>

#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

using HandClient = HandBiometricManagerClient;

struct ActivityOptions {
    bool stop = false;
    bool wait = false;
    WatchOptions watch;
};

int act(const HandActivity& activity, const ActivityOptions& options) {
    WatchOptions watch = options.watch;
    if (options.wait) {
        watch.goal = activity.goal;
    }
    const auto operateOnce = [&](const char* name, int (HandClient::*operation)(),
                                 const char* state) {
        return operate<HandManager>(
                name, [&](HandClient& client) { return (client.*operation)(); },
                fmt::format("{} {}", activity.done, state),
                JsonObject().add(activity.done, std::string(state)));
    };
    if (options.stop) {
        return operateOnce(activity.stopName, activity.stop, "stopped");
    }
    if (watch.isLimited()) {
        WatchSteps<HandClient> steps;
        steps.beginName = activity.startName;
        steps.begin = activity.start;
        steps.endName = activity.endName;
        steps.end = activity.end;
        return watchManager<HandManager>(watch, steps);
    }
    return operateOnce(activity.startName, activity.start, "started");
}

}  // namespace

void addHandActivityCommand(CLI::App& hand, Action& action, const HandActivity& activity) {
    auto options = std::make_shared<ActivityOptions>();
    Command command(hand, action, activity.name, activity.help);
    addWatchOptions(command, options->watch);
    addHandEventOption(command, options->watch);
    // Other events could not be waited for, and a number of them is another end.
    command.flag("--wait", options->wait, activity.waitHelp)
            .excludes("--count", "--wait")
            .excludes("--event", "--wait");
    if (activity.stop != nullptr) {
        command.flag("--stop", options->stop, "End it instead")
                .excludes("--count", "--stop")
                .excludes("--seconds", "--stop")
                .excludes("--wait", "--stop");
    }
    command.details(
                   "With --count, --seconds or --wait the events are watched, and what still goes "
                   "on then is ended. What --wait waits for has to come within --seconds, if they "
                   "are told.")
            .check([options] {
                return options->watch.output.empty() || options->watch.isLimited() || options->wait
                               ? ""
                               : "--output needs --count, --seconds or --wait";
            })
            .runs([options, activity] { return act(activity, *options); });
}

void addHandProfileCommand(CLI::App& hand, Action& action, const char* name, const char* help,
                           const char* operand, const char* operationName,
                           int (HandClient::*operation)(const char*), const char* done) {
    auto profile = std::make_shared<std::string>();
    Command(hand, action, name, help).operand(operand, *profile, "The profile's name").runs([=] {
        return operate<HandManager>(
                operationName,
                [&](HandClient& client) { return (client.*operation)(profile->c_str()); },
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
