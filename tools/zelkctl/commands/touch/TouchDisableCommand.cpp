// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/touch/TouchCommands.h"

namespace pemaro::zelkctl {

void addTouchDisableCommand(CLI::App& touch, Action& action) {
    addManagerNumberCommand<TouchManager>(touch, action, "disable", "Switch a feature off",
                                          "FEATURE", "feature", "disable",
                                          &TouchManagerClient::disable);
}

}  // namespace pemaro::zelkctl
