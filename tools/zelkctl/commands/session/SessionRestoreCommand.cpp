// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/session/SessionCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Number.h"

namespace pemaro::zelkctl {
namespace {

int restore(const std::string& text) {
    const auto session = readNumber("session restore", "ID", text, kSigned32);
    if (!session) {
        return tools::kExitFailure;
    }
    return operateClient(
            "restoreSession",
            [&](TouchCompanionClient& client) {
                return client.restoreSession(static_cast<int>(*session));
            },
            fmt::format("session {} restored", *session), std::to_string(*session));
}

}  // namespace

void addSessionRestoreCommand(CLI::App& session, Action& action) {
    addTextCommand(session, action, "restore", "Go back to the settings of a session", "ID",
                   "The session's number", restore);
}

}  // namespace pemaro::zelkctl
