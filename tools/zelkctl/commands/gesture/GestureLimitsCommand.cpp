// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/gesture/GestureCommands.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {
namespace {

using Client = GestureManagerClient;

int showLimits(bool json) {
    return withManager<GestureManager>([&](Client& client) {
        unsigned int predefined = 0;
        unsigned int userDefined = 0;
        int status = client.getMaxPreDefinedGesture(predefined);
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxPreDefinedGesture", status);
        }
        status = client.getMaxUserDefinedGesture(userDefined);
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxUserDefinedGesture", status);
        }
        if (json) {
            fmt::print("{}\n", JsonObject()
                                       .add("predefined", predefined)
                                       .add("userDefined", userDefined)
                                       .text());
        } else {
            fmt::print("predefined    {}\nuser-defined  {}\n", predefined, userDefined);
        }
        return tools::kExitSuccess;
    });
}

}  // namespace

void addGestureLimitsCommand(CLI::App& gesture, Action& action) {
    addQueryCommand(gesture, action, "limits", "Tell how many gestures there can be", showLimits);
}

}  // namespace pemaro::zelkctl
