// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <string>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Number.h"

namespace pemaro::zelkctl {
namespace {

int sendEvent(const std::string& typeText, const std::string& paramText) {
    const auto type = readNumber("event", "TYPE", typeText, kAny32);
    const auto param = type ? readNumber("event", "PARAM", paramText, kAny32) : std::nullopt;
    if (!param) {
        return tools::kExitFailure;
    }
    return operateClient(
            "sendEvent",
            [&](TouchCompanionClient& client) {
                return client.sendEvent(static_cast<eventType>(static_cast<int32_t>(*type)),
                                        static_cast<eventParam>(static_cast<int32_t>(*param)));
            },
            fmt::format("event {} with {} sent", *type, *param));
}

}  // namespace

void addEventCommand(CLI::App& app, Action& action) {
    auto type = std::make_shared<std::string>();
    auto param = std::make_shared<std::string>();
    CLI::App* command = app.add_subcommand("event", "Hand an event to the service");
    command->add_option("TYPE", *type, "A number that the service defines")->required();
    command->add_option("PARAM", *param, "A number that the service defines")->required();
    command->callback([=, &action] { action = [=] { return sendEvent(*type, *param); }; });
}

}  // namespace pemaro::zelkctl
