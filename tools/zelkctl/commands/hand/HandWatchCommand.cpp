// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/hand/HandCommands.h"

namespace pemaro::zelkctl {

void addHandWatchCommand(CLI::App& hand, Action& action) {
    addManagerWatchCommand<HandManager>(hand, action, "Print each event that is reported",
                                        addHandEventOption);
}

}  // namespace pemaro::zelkctl
