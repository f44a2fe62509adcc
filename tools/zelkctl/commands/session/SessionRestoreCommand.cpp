// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/session/SessionCommands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int restore(int session) {
    return operateClient(
            "restoreSession",
            [&](TouchCompanionClient& client) { return client.restoreSession(session); },
            fmt::format("session {} restored", session), JsonObject().add("session", session),
            fmt::format("session {}", session));
}

}  // namespace

void addSessionRestoreCommand(CLI::App& session, Action& action) {
    auto number = std::make_shared<int>(0);
    Command(session, action, "restore", "Go back to the settings of a session")
            .number("SESSION", *number, "The session's number")
            .runs([number] { return restore(*number); });
}

}  // namespace pemaro::zelkctl
