// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/Watch.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {

// Commands that more than one manager has.

/// Watches a manager's events, after an operation that the first connection is for, if any.
template <typename Manager>
int watchManager(const WatchOptions& options, int (Manager::Client::*begin)() = nullptr,
                 const char* beginName = nullptr) {
    return watch(options, [&](EventReceiver* receiver) {
        const android::sp<typename Manager::Client> client = Manager::create(receiver);
        Watched watched;
        watched.service = Manager::kService;
        watched.init = [client] { return client->init(); };
        watched.deinit = [client] { return client->deinit(); };
        watched.beginName = beginName;
        if (begin != nullptr) {
            watched.begin = [client, begin] { return (client.get()->*begin)(); };
        }
        return watched;
    });
}

template <typename Manager>
void addManagerWatchCommand(CLI::App& manager, Action& action, const char* help,
                            const std::function<void(CLI::App&, WatchOptions&)>& addMore) {
    addWatchCommand(manager, action, "watch", help, addMore,
                    [](const WatchOptions& options) { return watchManager<Manager>(options); });
}

/// A command with one number, which it hands to an operation; "NAME" prints "WHAT n NAMEd".
template <typename Manager>
void addManagerNumberCommand(CLI::App& manager, Action& action, const char* name, const char* help,
                             const char* what, const char* operationName,
                             int (Manager::Client::*operation)(int)) {
    addNumberCommand(manager, action, name, help, "NUMBER",
                     std::string("The ") + what + "'s number", [=](int number) {
                         return operate<Manager>(
                                 operationName,
                                 [=](typename Manager::Client& client) {
                                     return (client.*operation)(number);
                                 },
                                 fmt::format("{} {} {}d", what, number, name));
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

/// A command that takes one of two words; `run` is told whether it was the first.
void addEitherCommand(CLI::App& manager, Action& action, const char* name, const char* help,
                      const char* first, const char* second, std::function<int(bool isFirst)> run);

/// The same, with what a manager does for each.
template <typename Manager>
void addSwitchCommand(CLI::App& manager, Action& action, const char* name, const char* help,
                      SwitchWord<typename Manager::Client> on,
                      SwitchWord<typename Manager::Client> off) {
    using Client = typename Manager::Client;
    addEitherCommand(manager, action, name, help, on.word, off.word, [=](bool isOn) {
        const SwitchWord<Client>& chosen = isOn ? on : off;
        return operate<Manager>(
                chosen.operationName, [&](Client& client) { return (client.*chosen.operation)(); },
                chosen.done);
    });
}

}  // namespace pemaro::zelkctl
