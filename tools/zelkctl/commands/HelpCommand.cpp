// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <string>
#include <vector>

#include "tools/common/NearestWord.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {
namespace {

using Words = std::vector<std::string>;

/// The help of the command that the words name, as --help behind them prints it.
int showHelp(const CLI::App& app, const Words& words) {
    const CLI::App* command = &app;
    std::string path;
    for (const std::string& word : words) {
        const CLI::App* found = nullptr;
        Words known;
        for (const CLI::App* next : command->get_subcommands({})) {
            known.push_back(next->get_name());
            found = next->get_name() == word ? next : found;
        }
        if (found == nullptr) {
            const std::string nearest = tools::nearestWord(word, known);
            return failUsage(
                    fmt::format("there is no command '{}'{}", word,
                                nearest.empty() ? "" : "; did you mean '" + nearest + "'?"));
        }
        path += (path.empty() ? "" : " ") + command->get_name();
        command = found;
    }
    // The parser would go on to the commands that it has read: "help" itself.
    const std::string name = (path.empty() ? "" : path + " ") + command->get_name();
    tools::writeOutput(
            command->get_formatter()->make_help(command, name, CLI::AppFormatMode::Normal));
    return tools::kExitSuccess;
}

}  // namespace

void addHelpCommand(CLI::App& app, Action& action) {
    auto words = std::make_shared<Words>();
    Command(app, action, "help", "Print what there is, or how a command is used")
            .operands("COMMAND", *words, "The command, of one word or two", 0)
            .runs([&app, words] { return showHelp(app, *words); });
}

}  // namespace pemaro::zelkctl
