// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <CLI/CLI.hpp>
#include <memory>
#include <string>

#include "tools/zelkctl/Commands.h"
#include "tools/zelkctl/Managers.h"

namespace pemaro::zelkctl {

// Commands that more than one manager has.

template <typename Manager>
void addManagerWatchCommand(CLI::App& manager, Action& action, const char* help) {
    auto options = std::make_shared<WatchOptions>();
    CLI::App* command = manager.add_subcommand("watch", help);
    addWatchOptions(*command, *options);
    command->callback(
            [options, &action] { action = [options] { return watchManager<Manager>(*options); }; });
}

/// A command with one number, which it hands to an operation; "NAME" prints "WHAT n NAMEd".
template <typename Manager>
void addNumberCommand(CLI::App& manager, Action& action, const char* name, const char* help,
                      const char* what, const char* operationName,
                      int (Manager::Client::*operation)(int)) {
    auto number = std::make_shared<int>(0);
    CLI::App* command = manager.add_subcommand(name, help);
    command->add_option("NUMBER", *number, std::string("The ") + what + "'s number")->required();
    command->callback([=, &action] {
        action = [=] {
            return operate<Manager>(
                    operationName,
                    [=](typename Manager::Client& client) { return (client.*operation)(*number); },
                    fmt::format("{} {} {}d", what, *number, name));
        };
    });
}

/// One of the two words that a switch takes, and what it does and prints.
template <typename Client>
struct SwitchWord {
    const char* word;
    const char* operationName;
    int (Client::*operation)();
    const char* done;
};

/// A command that takes one of two words.
template <typename Manager>
void addSwitchCommand(CLI::App& manager, Action& action, const char* name, const char* help,
                      SwitchWord<typename Manager::Client> on,
                      SwitchWord<typename Manager::Client> off) {
    using Client = typename Manager::Client;
    auto word = std::make_shared<std::string>();
    CLI::App* command = manager.add_subcommand(name, help);
    command->add_option(std::string(on.word) + "|" + off.word, *word)
            ->required()
            ->check(CLI::IsMember({on.word, off.word}));
    command->callback([=, &action] {
        action = [=] {
            const SwitchWord<Client>& chosen = *word == on.word ? on : off;
            return operate<Manager>(
                    chosen.operationName,
                    [&](Client& client) { return (client.*chosen.operation)(); }, chosen.done);
        };
    });
}

}  // namespace pemaro::zelkctl
