// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Command.h"

namespace pemaro::zelkctl {

/// Not everywhere: it needs what reads the kernel's trace events.
void addTraceCommand(CLI::App& app, Action& action);

}  // namespace pemaro::zelkctl
