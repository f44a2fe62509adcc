// SPDX-License-Identifier: Apache-2.0
#include <algorithm>

#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/gesture/GestureCommands.h"
#include "tools/zelkctl/services/StackQuery.h"

namespace pemaro::zelkctl {

namespace {

/// No interface tells whether it is on; the simulated stack does.
std::string silenceOfGestures(GestureManagerClient&) {
    const std::vector<std::string> state = tryQueryStack("gesturestate");
    const auto isOff = [&state](const char* line) {
        return std::find(state.begin(), state.end(), line) != state.end();
    };
    return isOff("detection=off") && isOff("wakeup=off")
                   ? "detection and wake-up are off, and nothing will be reported (zelkctl gesture "
                     "detect start)"
                   : "";
}

}  // namespace

void addGestureWatchCommand(CLI::App& gesture, Action& action) {
    addManagerWatchCommand<GestureManager>(gesture, action, "Print each gesture that is reported",
                                           addGestureOptions, silenceOfGestures);
}

}  // namespace pemaro::zelkctl
