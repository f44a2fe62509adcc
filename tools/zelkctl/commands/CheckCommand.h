// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Commands.h"

namespace pemaro::zelkctl {

void addCheckCommand(CLI::App& app, Action& action);

}  // namespace pemaro::zelkctl
