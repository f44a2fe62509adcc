// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/session/SessionCommands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int save() {
    return withClient([](TouchCompanionClient& client) {
        int session = 0;
        const int status = call("saveSession", [&] { return client.saveSession(session); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("saveSession", status);
        }
        sayResult(fmt::format("session {}", session), JsonObject().add("session", session));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addSessionSaveCommand(CLI::App& session, Action& action) {
    Command(session, action, "save", "Save the settings of now, and print the session").runs(save);
}

}  // namespace pemaro::zelkctl
