// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <utility>

namespace pemaro::zelkctl {
namespace {

/// A command with one argument of a type.
template <typename Value>
void addArgumentCommand(CLI::App& app, Action& action, const char* name, const char* help,
                        const char* argument, const std::string& argumentHelp,
                        std::function<int(Value)> run) {
    auto value = std::make_shared<std::decay_t<Value>>();
    CLI::App* command = app.add_subcommand(name, help);
    command->add_option(argument, *value, argumentHelp)->required();
    command->callback([=, &action] { action = [=] { return run(*value); }; });
}

}  // namespace

CLI::App& addGroup(CLI::App& app, const char* name, const char* help) {
    CLI::App* group = app.add_subcommand(name, help);
    group->require_subcommand(0, 1);
    return *group;
}

void addPlainCommand(CLI::App& app, Action& action, const char* name, const char* help,
                     Action run) {
    app.add_subcommand(name, help)->callback([run = std::move(run), &action] { action = run; });
}

void addQueryCommand(CLI::App& app, Action& action, const char* name, const char* help,
                     std::function<int(bool json)> query) {
    auto json = std::make_shared<bool>(false);
    CLI::App* command = app.add_subcommand(name, help);
    command->add_flag("--json", *json, "Print a JSON object");
    command->callback([=, &action] { action = [=] { return query(*json); }; });
}

void addTextCommand(CLI::App& app, Action& action, const char* name, const char* help,
                    const char* argument, const char* argumentHelp,
                    std::function<int(const std::string& text)> run) {
    addArgumentCommand(app, action, name, help, argument, argumentHelp, std::move(run));
}

void addNumberCommand(CLI::App& app, Action& action, const char* name, const char* help,
                      const char* argument, const std::string& argumentHelp,
                      std::function<int(int number)> run) {
    addArgumentCommand(app, action, name, help, argument, argumentHelp, std::move(run));
}

}  // namespace pemaro::zelkctl
