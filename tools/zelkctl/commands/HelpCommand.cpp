// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <string>
#include <vector>

#include "tools/common/NearestWord.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {
namespace {

using Words = std::vector<std::string>;

/// What may follow a command, as an object.
void sayHelp(const CLI::App& command, const std::string& path) {
    JsonArray options;
    JsonArray operands;
    for (const CLI::Option* option : command.get_options()) {
        if (option->get_group().empty()) {
            continue;
        }
        const bool isOperand = option->get_positional();
        JsonObject entry;
        entry.add("name", option->get_name(isOperand)).add("help", option->get_description());
        if (!isOperand && option->get_expected_max() != 0) {
            entry.add("value", option->get_type_name());
        }
        (isOperand ? operands : options).add(entry);
    }
    JsonArray commands;
    for (const CLI::App* next : command.get_subcommands({})) {
        if (!next->get_group().empty()) {
            commands.add(JsonObject()
                                 .add("name", next->get_name())
                                 .add("help", next->get_description()));
        }
    }
    say(JsonObject()
                .add("command", path)
                .add("help", command.get_description())
                .add("details", command.get_footer())
                .add("operands", operands)
                .add("options", options)
                .add("commands", commands)
                .text());
}

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
            return failUsage(fmt::format("there is no command '{}'{}", word,
                                         tools::nearestWordHint(word, known)));
        }
        path += (path.empty() ? "" : " ") + command->get_name();
        command = found;
    }
    // The parser would go on to the commands that it has read: "help" itself.
    const std::string name = (path.empty() ? "" : path + " ") + command->get_name();
    if (settings().json) {
        sayHelp(*command, name);
    } else {
        tools::writeOutput(
                command->get_formatter()->make_help(command, name, CLI::AppFormatMode::Normal));
    }
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
