// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/touch/TouchCommands.h"

namespace pemaro::zelkctl {

void addTouchEnableCommand(CLI::App& touch, Action& action) {
    addManagerNumberCommand<TouchManager>(touch, action, "enable", "Switch a feature on", "FEATURE",
                                          "feature", "enable", &TouchManagerClient::enable);
}

}  // namespace pemaro::zelkctl
