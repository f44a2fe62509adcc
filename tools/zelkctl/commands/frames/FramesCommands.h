// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Commands.h"

namespace pemaro::zelkctl {

/// The group "frames" and its commands.
void addFramesCommands(CLI::App& app, Action& action);

void addFramesExportCommand(CLI::App& frames, Action& action);
void addFramesReportCommand(CLI::App& frames, Action& action);
void addFramesStatCommand(CLI::App& frames, Action& action);
void addFramesWatchCommand(CLI::App& frames, Action& action);

}  // namespace pemaro::zelkctl
