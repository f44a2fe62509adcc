// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/gesture/GestureCommands.h"

namespace pemaro::zelkctl {

void addGestureDeleteCommand(CLI::App& gesture, Action& action) {
    addManagerNumberCommand<GestureManager>(gesture, action, "delete", "Forget a defined gesture",
                                            "GESTURE", "gesture", "deleteGesture",
                                            &GestureManagerClient::deleteGesture);
}

}  // namespace pemaro::zelkctl
