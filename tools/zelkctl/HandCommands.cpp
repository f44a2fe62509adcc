// SPDX-License-Identifier: Apache-2.0
#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "tools/zelkctl/Json.h"
#include "tools/zelkctl/ManagerCommands.h"

namespace pemaro::zelkctl {
namespace {

using Client = HandBiometricManagerClient;

/// An activity of the service: how it is started, and how ended where it can be.
struct Activity {
    const char* name;
    const char* help;
    const char* done;
    const char* startName;
    int (Client::*start)();
    const char* stopName;
    int (Client::*stop)();
};

constexpr Activity kActivities[] = {
        {"enroll", "Enroll a hand as a new profile", "enrollment", "startEnrollment",
         &Client::startEnrollment, "stopEnrollment", &Client::stopEnrollment},
        {"scan", "Scan a hand", "scan", "scan", &Client::scan, nullptr, nullptr},
        {"match", "Match hands against the profiles", "matching", "startMatching",
         &Client::startMatching, "stopMatching", &Client::stopMatching},
};

struct ActivityOptions {
    bool stop = false;
    WatchOptions watch;
};

int act(const Activity& activity, const ActivityOptions& options) {
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

/// A name as it can be printed on one line.
std::string printable(std::string name) {
    std::replace_if(
            name.begin(), name.end(), [](unsigned char byte) { return byte < ' ' || byte == 0x7F; },
            '?');
    return name;
}

void printProfiles(const std::vector<std::string>& names, unsigned int most, bool json) {
    if (!json) {
        for (const std::string& name : names) {
            fmt::print("{}\n", printable(name));
        }
        fmt::print("{} of {} profiles\n", names.size(), most);
        return;
    }
    fmt::print("{}\n", JsonObject().add("profiles", names).add("max", most).text());
}

int showProfiles(bool json) {
    return withManager<HandManager>([json](Client& client) {
        unsigned int most = 0;
        std::vector<std::string> names;
        int status = client.getMaxUser(most);
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxUser", status);
        }
        status = client.getProfileList(names);
        if (status != STATUS_NO_ERROR) {
            return failStatus("getProfileList", status);
        }
        printProfiles(names, most, json);
        return tools::kExitSuccess;
    });
}

void addActivityCommand(CLI::App& hand, Action& action, const Activity& activity) {
    auto options = std::make_shared<ActivityOptions>();
    CLI::App* command = hand.add_subcommand(
            activity.name,
            std::string(activity.help) + "; with --count or --seconds, watch the events");
    addWatchOptions(*command, options->watch);
    if (activity.stop != nullptr) {
        command->add_flag("--stop", options->stop, "End it instead")
                ->excludes("--count")
                ->excludes("--seconds");
    }
    command->callback([options, &activity, &action] {
        action = [options, &activity] { return act(activity, *options); };
    });
}

void addCancelCommand(CLI::App& hand, Action& action) {
    hand.add_subcommand("cancel", "Give up what is going on")->callback([&action] {
        action = [] {
            return operate<HandManager>(
                    "cancelScan", [](Client& client) { return client.cancelScan(); }, "cancelled");
        };
    });
}

void addSecurityCommand(CLI::App& hand, Action& action) {
    auto level = std::make_shared<int>(0);
    CLI::App* command = hand.add_subcommand("security", "Set the security level");
    command->add_option("LEVEL", *level, "A number that the service defines")->required();
    command->callback([level, &action] {
        action = [level] {
            return operate<HandManager>(
                    "setSecurity", [&](Client& client) { return client.setSecurity(*level); },
                    fmt::format("security level {}", *level));
        };
    });
}

void addProfilesCommand(CLI::App& hand, Action& action) {
    auto json = std::make_shared<bool>(false);
    CLI::App* command = hand.add_subcommand("profiles", "List the enrolled profiles");
    command->add_flag("--json", *json, "Print a JSON object");
    command->callback([json, &action] { action = [json] { return showProfiles(*json); }; });
}

/// A command about one profile by its name.
void addNameCommand(CLI::App& hand, Action& action, const char* name, const char* help,
                    const char* operationName, int (Client::*operation)(const char*),
                    const char* done) {
    auto profile = std::make_shared<std::string>();
    CLI::App* command = hand.add_subcommand(name, help);
    command->add_option("NAME", *profile, "The profile's name")->required();
    command->callback([=, &action] {
        action = [=] {
            return operate<HandManager>(
                    operationName,
                    [&](Client& client) { return (client.*operation)(profile->c_str()); },
                    fmt::format("profile {} {}", printable(*profile), done));
        };
    });
}

void addRenameCommand(CLI::App& hand, Action& action) {
    auto first = std::make_shared<std::string>();
    auto second = std::make_shared<std::string>();
    CLI::App* command = hand.add_subcommand("rename", "Give a profile another name");
    command->add_option("FIRST", *first, "The current name (the service may see it otherwise)")
            ->required();
    command->add_option("SECOND", *second, "The new name")->required();
    command->callback([=, &action] {
        action = [=] {
            return operate<HandManager>(
                    "renameProfile",
                    [&](Client& client) {
                        return client.renameProfile(first->c_str(), second->c_str());
                    },
                    fmt::format("profile {} renamed {}", printable(*first), printable(*second)));
        };
    });
}

}  // namespace

void addHandCommands(CLI::App& app, Action& action) {
    CLI::App* hand = app.add_subcommand("hand", "Talk to the hand biometric manager");
    hand->require_subcommand(0, 1);
    for (const Activity& activity : kActivities) {
        addActivityCommand(*hand, action, activity);
    }
    addCancelCommand(*hand, action);
    addSecurityCommand(*hand, action);
    addProfilesCommand(*hand, action);
    addNameCommand(*hand, action, "name", "Name the profile that was enrolled last",
                   "setProfileName", &Client::setProfileName, "named");
    addRenameCommand(*hand, action);
    addNameCommand(*hand, action, "delete", "Forget a profile", "deleteProfile",
                   &Client::deleteProfile, "deleted");
    addSwitchCommand<HandManager>(*hand, action, "wakeup", "Whether a hand wakes the device",
                                  {"on", "enableWakeup", &Client::enableWakeup, "wake-up on"},
                                  {"off", "disableWakeup", &Client::disableWakeup, "wake-up off"});
    addManagerWatchCommand<HandManager>(*hand, action, "Print each event that is reported");
}

}  // namespace pemaro::zelkctl
