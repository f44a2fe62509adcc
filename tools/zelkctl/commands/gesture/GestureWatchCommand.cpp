// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/gesture/GestureCommands.h"

namespace pemaro::zelkctl {

void addGestureWatchCommand(CLI::App& gesture, Action& action) {
    addManagerWatchCommand<GestureManager>(gesture, action, "Print each gesture that is reported",
                                           addGestureOptions);
}

}  // namespace pemaro::zelkctl
