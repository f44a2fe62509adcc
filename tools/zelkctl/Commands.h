// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <CLI/CLI.hpp>
#include <functional>

namespace pemaro::zelkctl {

/// What a command does once the command line is known to be right; returns the exit status.
using Action = std::function<int()>;

/// Each adds its commands and their arguments to `app`, and sets `action` when one is chosen. The
/// arguments live as long as `app`.
void addPingCommand(CLI::App& app, Action& action);
void addRecordCommand(CLI::App& app, Action& action);
void addRecordFileCommand(CLI::App& app, Action& action);
void addDeviceCommands(CLI::App& app, Action& action);
void addConfigCommands(CLI::App& app, Action& action);
void addSessionCommands(CLI::App& app, Action& action);
void addTouchCommands(CLI::App& app, Action& action);
void addGestureCommands(CLI::App& app, Action& action);
void addHandCommands(CLI::App& app, Action& action);

}  // namespace pemaro::zelkctl
