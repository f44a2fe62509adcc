// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/session/SessionCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/StackQuery.h"

namespace pemaro::zelkctl {
namespace {

int list() {
    return withClient([](TouchCompanionClient& client) {
        std::vector<std::string> sessions;
        const int status = queryStack(client, "sessions", sessions);
        if (status != STATUS_NO_ERROR) {
            return failStatus("session list", status, noInterfaceFor("list of sessions"));
        }
        for (const std::string& session : sessions) {
            sayResult(session, JsonObject().addParsed("session", session));
        }
        return tools::kExitSuccess;
    });
}

}  // namespace

void addSessionListCommand(CLI::App& session, Action& action) {
    Command(session, action, "list", "List the sessions that can be restored")
            .details("The interface has no such list; the simulated stack tells its own.")
            .runs(list);
}

}  // namespace pemaro::zelkctl
