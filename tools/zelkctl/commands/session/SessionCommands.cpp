// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/session/SessionCommands.h"

namespace pemaro::zelkctl {

void addSessionCommands(CLI::App& app, Action& action) {
    CLI::App& session = addGroup(app, "session", "Keep the service's settings for later");
    addSessionSaveCommand(session, action);
    addSessionListCommand(session, action);
    addSessionRestoreCommand(session, action);
}

}  // namespace pemaro::zelkctl
