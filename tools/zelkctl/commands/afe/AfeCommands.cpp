// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/afe/AfeCommands.h"

namespace pemaro::zelkctl {

void addAfeCommands(CLI::App& app, Action& action) {
    CLI::App& afe = addGroup(app, "afe", "Read and change the analog front end");
    addAfeGetCommand(afe, action);
    addAfeSetCommand(afe, action);
}

}  // namespace pemaro::zelkctl
