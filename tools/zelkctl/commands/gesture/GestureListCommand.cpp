// SPDX-License-Identifier: Apache-2.0
#include <sstream>

#include "tools/zelkctl/commands/gesture/GestureCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/StackQuery.h"

namespace pemaro::zelkctl {
namespace {

/// A line is "9 enabled 2": the number, whether it is looked for, and its samples.
void sayGesture(const std::string& line) {
    std::istringstream stream(line);
    int number = 0;
    int samples = 0;
    std::string state;
    stream >> number >> state >> samples;
    sayResult(fmt::format("{:10}  {:8}  {}", number, state,
                          samples == 0 ? "predefined" : fmt::format("{} samples", samples)),
              JsonObject()
                      .add("gesture", number)
                      .addFlag("enabled", state == "enabled")
                      .addFlag("predefined", samples == 0)
                      .add("samples", samples));
}

int list() {
    return withClient([](TouchCompanionClient& client) {
        std::vector<std::string> gestures;
        const int status = queryStack(client, "gestures", gestures);
        if (status != STATUS_NO_ERROR) {
            return failStatus("gesture list", status, noInterfaceFor("list of gestures"));
        }
        for (const std::string& gesture : gestures) {
            sayGesture(gesture);
        }
        return tools::kExitSuccess;
    });
}

}  // namespace

void addGestureListCommand(CLI::App& gesture, Action& action) {
    Command(gesture, action, "list", "List the gestures, and whether they are looked for")
            .details(
                    "The interface has no such list; the simulated stack tells its own through "
                    "the touch companion.")
            .runs(list);
}

}  // namespace pemaro::zelkctl
