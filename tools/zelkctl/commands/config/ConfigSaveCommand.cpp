// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/config/ConfigCommands.h"

namespace pemaro::zelkctl {

void addConfigSaveCommand(CLI::App& config, Action& action) {
    addServiceFileCommand(config, action, "save", "Make the service write its configuration",
                          "saveConfig", &TouchCompanionClient::saveConfig, "saved");
}

}  // namespace pemaro::zelkctl
