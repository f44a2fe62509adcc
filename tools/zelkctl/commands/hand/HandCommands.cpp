// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
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
    if (options.stop) {
        return operate<HandManager>(
                activity.stopName, [&](Client& client) { return (client.*activity.stop)(); },
                fmt::format("{} stopped", activity.done));
    }
    if (options.watch.isLimited()) {
        return watchManager<HandManager>(options.watch, activity.start, activity.startName);
    }
    return operate<HandManager>(
            activity.startName, [&](Client& client) { return (client.*activity.start)(); },
            fmt::format("{} started", activity.done));
}

}  // namespace

void addHandActivityCommand(CLI::App& hand, Action& action, const HandActivity& activity) {
    auto options = std::make_shared<ActivityOptions>();
    CLI::App* command = hand.add_subcommand(
            activity.name,
            std::string(activity.help) + "; with --count or --seconds, watch the events");
    addWatchOptions(*command, options->watch);
    addHandEventOption(*command, options->watch);
    if (activity.stop != nullptr) {
        command->add_flag("--stop", options->stop, "End it instead")
                ->excludes("--count")
                ->excludes("--seconds");
    }
    command->callback([options, activity, &action] {
        action = [options, activity] { return act(activity, *options); };
    });
}

void addHandProfileCommand(CLI::App& hand, Action& action, const char* name, const char* help,
                           const char* operationName, int (Client::*operation)(const char*),
                           const char* done) {
    addTextCommand(hand, action, name, help, "NAME", "The profile's name",
                   [=](const std::string& profile) {
                       return operate<HandManager>(
                               operationName,
                               [&](Client& client) { return (client.*operation)(profile.c_str()); },
                               fmt::format("profile {} {}", printable(profile), done));
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
