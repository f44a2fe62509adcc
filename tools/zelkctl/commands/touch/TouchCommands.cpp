// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/touch/TouchCommands.h"

namespace pemaro::zelkctl {

void addTouchCommands(CLI::App& app, Action& action) {
    CLI::App& touch = addGroup(app, "touch", "Talk to the touch manager");
    addTouchFeaturesCommand(touch, action);
    addTouchEnableCommand(touch, action);
    addTouchDisableCommand(touch, action);
    addTouchRegionCommand(touch, action);
    addTouchWatchCommand(touch, action);
}

}  // namespace pemaro::zelkctl
