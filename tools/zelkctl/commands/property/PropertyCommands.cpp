// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/property/PropertyCommands.h"

namespace pemaro::zelkctl {

void addPropertyCommands(CLI::App& app, Action& action) {
    CLI::App& property = addGroup(app, "property", "Read and change properties");
    addPropertyGetCommand(property, action);
    addPropertySetCommand(property, action);
}

}  // namespace pemaro::zelkctl
