// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <string>

#include "tools/zelkctl/Commands.h"
#include "tools/zelkctl/Companion.h"
#include "tools/zelkctl/Json.h"
#include "tools/zelkctl/Number.h"

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

void addSessionCommands(CLI::App& app, Action& action) {
    CLI::App* session = app.add_subcommand("session", "Keep the service's settings for later");
    session->require_subcommand(0, 1);

    auto json = std::make_shared<bool>(false);
    CLI::App* command =
            session->add_subcommand("save", "Save the settings of now, and print the session");
    command->add_flag("--json", *json, "Print a JSON object");
    command->callback([=, &action] { action = [=] { return save(*json); }; });

    auto id = std::make_shared<std::string>();
    command = session->add_subcommand("restore", "Go back to the settings of a session");
    command->add_option("ID", *id, "The session's number")->required();
    command->callback([=, &action] { action = [=] { return restore(*id); }; });
}

}  // namespace pemaro::zelkctl
