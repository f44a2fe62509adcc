// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/config/ConfigCommands.h"

namespace pemaro::zelkctl {

void addConfigReloadCommand(CLI::App& config, Action& action) {
    addServiceFileCommand(config, action, "reload", "Make the service read its configuration",
                          "reloadConfig", &TouchCompanionClient::reloadConfig, "reloaded");
}

}  // namespace pemaro::zelkctl
