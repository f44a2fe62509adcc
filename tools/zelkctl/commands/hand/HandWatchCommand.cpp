// SPDX-License-Identifier: Apache-2.0
#include <algorithm>

#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/StackQuery.h"

namespace pemaro::zelkctl {

namespace {

/// No interface tells whether anything goes on; the simulated stack does.
std::string silenceOfHands(HandBiometricManagerClient&) {
    const std::vector<std::string> state = tryQueryStack("handstate");
    const auto holds = [&state](const char* line) {
        return std::find(state.begin(), state.end(), line) != state.end();
    };
    return holds("activity=idle") && holds("wakeup=off")
                   ? "nothing goes on and wake-up is off, and nothing will be reported (zelkctl "
                     "hand match)"
                   : "";
}

}  // namespace

void addHandWatchCommand(CLI::App& hand, Action& action) {
    addManagerWatchCommand<HandManager>(hand, action, "Print each event that is reported",
                                        addHandEventOption, silenceOfHands);
}

}  // namespace pemaro::zelkctl
