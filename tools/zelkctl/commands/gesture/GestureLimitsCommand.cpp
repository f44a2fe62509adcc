// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/gesture/GestureCommands.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {
namespace {

using Client = GestureManagerClient;

int showLimits() {
    return withManager<GestureManager>([&](Client& client) {
        unsigned int predefined = 0;
        unsigned int userDefined = 0;
        int status = call("getMaxPreDefinedGesture",
                          [&] { return client.getMaxPreDefinedGesture(predefined); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxPreDefinedGesture", status);
        }
        status = call("getMaxUserDefinedGesture",
                      [&] { return client.getMaxUserDefinedGesture(userDefined); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxUserDefinedGesture", status);
        }
        sayResult(fmt::format("predefined    {}\nuser-defined  {}", predefined, userDefined),
                  JsonObject().add("predefined", predefined).add("userDefined", userDefined));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addGestureLimitsCommand(CLI::App& gesture, Action& action) {
    Command(gesture, action, "limits", "Tell how many gestures there can be").runs(showLimits);
}

}  // namespace pemaro::zelkctl
