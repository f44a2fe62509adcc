// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/touch/TouchCommands.h"

namespace pemaro::zelkctl {

void addTouchWatchCommand(CLI::App& touch, Action& action) {
    addManagerWatchCommand<TouchManager>(
            touch, action, "Print each gesture that is reported",
            [](Command& command, WatchOptions& options) {
                addGestureOptions(command, options);
                addFeatureOption(command, options);
            },
            silenceOfTouch);
}

}  // namespace pemaro::zelkctl
