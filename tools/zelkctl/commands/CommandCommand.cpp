// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <cstdlib>
#include <memory>
#include <string>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/terminal/Number.h"

namespace pemaro::zelkctl {
namespace {

using Text = std::unique_ptr<char, decltype(&free)>;

/// A name that the text form of a map can carry, which has no way to quote a quote.
bool checkName(const char* command, const std::string& name) {
    if (!name.empty() && name.find_first_of("\"\\") == std::string::npos) {
        return true;
    }
    failStatus(command, STATUS_INVALID_COMMAND,
               name.empty() ? "it has no name" : "a name has no \" and no \\");
    return false;
}

/// The library takes all that stands behind the first space for numbers.
bool checkCommand(const std::string& text) {
    const size_t space = text.find(' ');
    return checkName("command", text.substr(0, space)) &&
           (space == std::string::npos || checkNumbers("command", text.substr(space + 1)));
}

int sendCommand(const std::string& text, bool json) {
    if (!checkCommand(text)) {
        return tools::kExitFailure;
    }
    return withFacade([&](ITouchCompanionFacade& facade) {
        char* received = nullptr;
        const int status = facade.sendCommand(text.c_str(), &received);
        const Text answer(received, &free);
        if (status != STATUS_NO_ERROR) {
            return failStatus("sendCommand", status);
        }
        fmt::print("{}\n", json ? JsonObject().add("answer", answer.get()).text() : answer.get());
        return tools::kExitSuccess;
    });
}

}  // namespace

void addCommandCommand(CLI::App& app, Action& action) {
    auto text = std::make_shared<std::string>();
    auto json = std::make_shared<bool>(false);
    CLI::App* command = app.add_subcommand("command", "Send a debug command, and print the answer");
    command->add_option("TEXT", *text, "The command's name and its numbers, as one argument")
            ->required();
    command->add_flag("--json", *json, "Print a JSON object");
    command->callback([=, &action] { action = [=] { return sendCommand(*text, *json); }; });
}

}  // namespace pemaro::zelkctl
