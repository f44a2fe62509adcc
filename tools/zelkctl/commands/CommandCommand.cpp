// SPDX-License-Identifier: Apache-2.0
#include <cstdlib>
#include <memory>
#include <string>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/MapText.h"

namespace pemaro::zelkctl {
namespace {

using Text = std::unique_ptr<char, decltype(&free)>;

/// The library takes all that stands behind the first space for numbers.
std::string commandProblem(const std::string& text) {
    const size_t space = text.find(' ');
    const std::string wrong = keyProblem(text.substr(0, space));
    return wrong.empty() && space != std::string::npos
                   ? tools::numberListProblem(text.substr(space + 1))
                   : wrong;
}

int sendCommand(const std::string& text) {
    return withFacade([&](ITouchCompanionFacade& facade) {
        char* received = nullptr;
        const int status =
                call("sendCommand", [&] { return facade.sendCommand(text.c_str(), &received); });
        const Text answer(received, &free);
        if (status != STATUS_NO_ERROR) {
            return failStatus("sendCommand", status, text);
        }
        sayResult(answer.get(), JsonObject().add("answer", std::string(answer.get())));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addCommandCommand(CLI::App& app, Action& action) {
    auto text = std::make_shared<std::string>();
    Command(app, action, "command", "Send a debug command, and print the answer")
            .operand("TEXT", *text, "The command's name and its numbers, as one argument")
            .details(
                    "The service defines the commands. One space stands before each number; a "
                    "name contains neither \" nor \\.")
            .check([text] {
                const std::string problem = commandProblem(*text);
                return problem.empty() ? "" : "TEXT: " + problem;
            })
            .runs([text] { return sendCommand(*text); });
}

}  // namespace pemaro::zelkctl
