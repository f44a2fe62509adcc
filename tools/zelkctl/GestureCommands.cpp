// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <string>
#include <vector>

#include "tools/zelkctl/Commands.h"
#include "tools/zelkctl/GestureFile.h"
#include "tools/zelkctl/Json.h"
#include "tools/zelkctl/ManagerCommands.h"
#include "tools/zelkctl/Transaction.h"

namespace pemaro::zelkctl {
namespace {

using Client = GestureManagerClient;
using Gesture = IGestureManagerClient::GestureData;
using Files = std::vector<std::string>;

/// Many more than a transaction can carry, and few enough to be read.
constexpr size_t kMaxRecords = 256;

int addGesture(const Files& files) {
    std::vector<Gesture> records;
    for (const std::string& file : files) {
        const std::string problem = readGestures(file, kMaxRecords, records);
        if (!problem.empty()) {
            return fail(problem);
        }
    }
    return withManager<GestureManager>([&](Client& client) {
        int number = 0;
        const int status =
                client.addGesture(static_cast<int>(records.size()), records.data(), number);
        const size_t bytes = records.size() * sizeof(Gesture);
        if (status == STATUS_UNKNOWN_ERROR && bytes > kTransactionBytes) {
            return fail(fmt::format(
                    "addGesture: {} ({} records are {} bytes, and a transaction "
                    "carries {} records at most; nothing was added)",
                    errStr(status), records.size(), bytes, kTransactionBytes / sizeof(Gesture)));
        }
        if (status != STATUS_NO_ERROR) {
            return failStatus("addGesture", status);
        }
        fmt::print("gesture {} added\n", number);
        return tools::kExitSuccess;
    });
}

int verifyGesture(const std::string& file) {
    std::vector<Gesture> records;
    const std::string problem = readGestures(file, 1, records);
    if (!problem.empty()) {
        return fail(problem);
    }
    return withManager<GestureManager>([&](Client& client) {
        int number = 0;
        const int status = client.verifyGesture(records.data(), number);
        if (status != STATUS_NO_ERROR) {
            return failStatus("verifyGesture", status);
        }
        fmt::print("gesture {}\n", number);
        return tools::kExitSuccess;
    });
}

int showLimits(bool json) {
    return withManager<GestureManager>([&](Client& client) {
        unsigned int predefined = 0;
        unsigned int userDefined = 0;
        int status = client.getMaxPreDefinedGesture(predefined);
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxPreDefinedGesture", status);
        }
        status = client.getMaxUserDefinedGesture(userDefined);
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxUserDefinedGesture", status);
        }
        if (json) {
            fmt::print("{}\n", JsonObject()
                                       .add("predefined", predefined)
                                       .add("userDefined", userDefined)
                                       .text());
        } else {
            fmt::print("predefined    {}\nuser-defined  {}\n", predefined, userDefined);
        }
        return tools::kExitSuccess;
    });
}

void addAddCommand(CLI::App& gesture, Action& action) {
    auto files = std::make_shared<Files>();
    CLI::App* command =
            gesture.add_subcommand("add",
                                   "Define a gesture by one or more samples, and tell its "
                                   "number");
    command->add_option("FILE", *files, "Files of samples, records of 72,144 bytes")->required();
    command->callback([files, &action] { action = [files] { return addGesture(*files); }; });
}

void addVerifyCommand(CLI::App& gesture, Action& action) {
    auto file = std::make_shared<std::string>();
    CLI::App* command = gesture.add_subcommand(
            "verify", "Compare a drawn gesture with the defined ones, and tell its number");
    command->add_option("FILE", *file, "File of one record of 72,144 bytes")->required();
    command->callback([file, &action] { action = [file] { return verifyGesture(*file); }; });
}

void addLimitsCommand(CLI::App& gesture, Action& action) {
    auto json = std::make_shared<bool>(false);
    CLI::App* command = gesture.add_subcommand("limits", "Tell how many gestures there can be");
    command->add_flag("--json", *json, "Print a JSON object");
    command->callback([json, &action] { action = [json] { return showLimits(*json); }; });
}

}  // namespace

void addGestureCommands(CLI::App& app, Action& action) {
    CLI::App* gesture = app.add_subcommand("gesture", "Talk to the gesture manager");
    gesture->require_subcommand(0, 1);
    addSwitchCommand<GestureManager>(
            *gesture, action, "wakeup", "Whether gestures wake the device",
            {"on", "enableWakeup", &Client::enableWakeup, "wake-up on"},
            {"off", "disableWakeup", &Client::disableWakeup, "wake-up off"});
    addSwitchCommand<GestureManager>(
            *gesture, action, "detect", "Whether gestures are looked for",
            {"start", "startGestureDetection", &Client::startGestureDetection, "detection started"},
            {"stop", "stopGestureDetection", &Client::stopGestureDetection, "detection stopped"});
    addAddCommand(*gesture, action);
    addNumberCommand<GestureManager>(*gesture, action, "delete", "Forget a defined gesture",
                                     "gesture", "deleteGesture", &Client::deleteGesture);
    addNumberCommand<GestureManager>(*gesture, action, "enable", "Look for a gesture again",
                                     "gesture", "enableGesture", &Client::enableGesture);
    addNumberCommand<GestureManager>(*gesture, action, "disable",
                                     "Keep a gesture, but do not look for it", "gesture",
                                     "disableGesture", &Client::disableGesture);
    addVerifyCommand(*gesture, action);
    addLimitsCommand(*gesture, action);
    addManagerWatchCommand<GestureManager>(*gesture, action, "Print each gesture that is reported");
}

}  // namespace pemaro::zelkctl
