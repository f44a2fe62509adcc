// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int authenticate(const std::string& text) {
    return operateClient(
            "setAuth", [&](TouchCompanionClient& client) { return client.setAuth(text.c_str()); },
            "authenticated", JsonObject().addFlag("authenticated", true));
}

}  // namespace

void addAuthCommand(CLI::App& app, Action& action) {
    auto text = std::make_shared<std::string>();
    Command(app, action, "auth", "Authenticate with the service")
            .operand("TEXT", *text, "What the service wants to hear")
            .details("Whoever may list processes can read TEXT.")
            .runs([text] { return authenticate(*text); });
}

}  // namespace pemaro::zelkctl
