// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/HandBiometricManagerClient.h"
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/EventReceiver.h"

namespace pemaro::zelkctl {

// The commands behind "hand".

void addHandEnrollCommand(CLI::App& hand, Action& action);
void addHandScanCommand(CLI::App& hand, Action& action);
void addHandMatchCommand(CLI::App& hand, Action& action);
void addHandCancelCommand(CLI::App& hand, Action& action);
void addHandSecurityCommand(CLI::App& hand, Action& action);
void addHandProfilesCommand(CLI::App& hand, Action& action);
void addHandNameCommand(CLI::App& hand, Action& action);
void addHandRenameCommand(CLI::App& hand, Action& action);
void addHandDeleteCommand(CLI::App& hand, Action& action);
void addHandWakeupCommand(CLI::App& hand, Action& action);
void addHandWatchCommand(CLI::App& hand, Action& action);

/// An activity of the service: how it is started, how ended on request where it can be, and how
/// when the watch of it ends before it.
struct HandActivity {
    const char* name;
    const char* help;
    const char* done;
    const char* startName;
    int (HandBiometricManagerClient::*start)();
    const char* stopName;
    int (HandBiometricManagerClient::*stop)();
    const char* endName;
    int (HandBiometricManagerClient::*end)();
    /// What --wait waits for.
    EventGoal goal;
    const char* waitHelp;
};

/// A command that starts an activity, watches what comes of it, or stops it.
void addHandActivityCommand(CLI::App& hand, Action& action, const HandActivity& activity);

/// A command about one profile by its name.
void addHandProfileCommand(CLI::App& hand, Action& action, const char* name, const char* help,
                           const char* operand, const char* operationName,
                           int (HandBiometricManagerClient::*operation)(const char*),
                           const char* done);

}  // namespace pemaro::zelkctl
