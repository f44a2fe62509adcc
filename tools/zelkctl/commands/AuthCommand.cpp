// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int authenticate(const std::string& text) {
    return operateClient(
            "setAuth", [&](TouchCompanionClient& client) { return client.setAuth(text.c_str()); },
            "authenticated");
}

}  // namespace

void addAuthCommand(CLI::App& app, Action& action) {
    addTextCommand(app, action, "auth", "Authenticate with the service", "TEXT",
                   "What the service wants to hear", authenticate);
}

}  // namespace pemaro::zelkctl
