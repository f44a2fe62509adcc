// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "tools/zelkctl/commands/Command.h"

namespace pemaro::zelkctl {

/// Adds the command, or group of commands, of this name to `app`, or where there is none of this name
/// all of them, in the order in which the help lists them; each sets `action` when it is chosen. The
/// arguments live as long as `app`.
void addCommands(CLI::App& app, Action& action, std::string_view name);

// Each adds its command, or its group of commands.

void addHelpCommand(CLI::App& app, Action& action);
void addStatusCommand(CLI::App& app, Action& action);
void addInfoCommand(CLI::App& app, Action& action);
void addPingCommand(CLI::App& app, Action& action);
void addRecordCommand(CLI::App& app, Action& action);
void addRecordFileCommand(CLI::App& app, Action& action);
void addCommandCommand(CLI::App& app, Action& action);
void addFilterCommand(CLI::App& app, Action& action);
void addPropertyCommands(CLI::App& app, Action& action);
void addAfeCommands(CLI::App& app, Action& action);
void addEventCommand(CLI::App& app, Action& action);
void addInspectCommand(CLI::App& app, Action& action);
void addPacketSizeCommand(CLI::App& app, Action& action);
void addAuthCommand(CLI::App& app, Action& action);
void addConfigCommands(CLI::App& app, Action& action);
void addSessionCommands(CLI::App& app, Action& action);
void addTouchCommands(CLI::App& app, Action& action);
void addGestureCommands(CLI::App& app, Action& action);
void addHandCommands(CLI::App& app, Action& action);

/// What `completion` offers for the operands of a command; not listed.
void addWordsCommand(CLI::App& app, Action& action);

}  // namespace pemaro::zelkctl
