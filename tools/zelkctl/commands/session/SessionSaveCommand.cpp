// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/session/SessionCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {
namespace {

int save(bool json) {
    return withClient([json](TouchCompanionClient& client) {
        int session = 0;
        const int status = client.saveSession(session);
        if (status != STATUS_NO_ERROR) {
            return failStatus("saveSession", status);
        }
        fmt::print("{}\n", json ? JsonObject().add("session", session).text()
                                : fmt::format("session {}", session));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addSessionSaveCommand(CLI::App& session, Action& action) {
    addQueryCommand(session, action, "save", "Save the settings of now, and print the session",
                    save);
}

}  // namespace pemaro::zelkctl
