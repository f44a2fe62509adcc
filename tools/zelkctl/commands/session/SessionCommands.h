// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Commands.h"

namespace pemaro::zelkctl {

// The commands behind "session".

void addSessionSaveCommand(CLI::App& session, Action& action);
void addSessionListCommand(CLI::App& session, Action& action);
void addSessionRestoreCommand(CLI::App& session, Action& action);

}  // namespace pemaro::zelkctl
