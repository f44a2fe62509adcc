// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <memory>
#include <string>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/Watch.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {

// Commands that more than one manager has.

/// What a watch does besides, with the client that it has.
template <typename Client>
struct WatchSteps {
    const char* beginName = nullptr;
    int (Client::*begin)() = nullptr;
    const char* endName = nullptr;
    int (Client::*end)() = nullptr;
    std::string (*silence)(Client&) = nullptr;
};

/// Watches a manager's events.
template <typename Manager>
int watchManager(const WatchOptions& options,
                 const WatchSteps<typename Manager::Client>& steps = {}) {
    return watch(options, [&](EventReceiver* receiver) {
        const android::sp<typename Manager::Client> client = Manager::create(receiver);
        Watched watched;
        watched.service = Manager::kService;
        watched.init = [client] { return client->init(); };
        watched.deinit = [client] { return client->deinit(); };
        watched.beginName = steps.beginName;
        watched.endName = steps.endName;
        if (steps.begin != nullptr) {
            watched.begin = [client, steps] { return (client.get()->*steps.begin)(); };
        }
        if (steps.end != nullptr) {
            watched.end = [client, steps] { return (client.get()->*steps.end)(); };
        }
        if (steps.silence != nullptr) {
            watched.silence = [client, steps] { return steps.silence(*client); };
        }
        return watched;
    });
}

/// `silence` tells why no events are to be expected, or nothing.
template <typename Manager>
void addManagerWatchCommand(CLI::App& manager, Action& action, const char* help,
                            const std::function<void(Command&, WatchOptions&)>& addMore,
                            std::string (*silence)(typename Manager::Client&)) {
    addWatchCommand(manager, action, "watch", help, addMore,
                    [silence](const WatchOptions& options) {
                        WatchSteps<typename Manager::Client> steps;
                        steps.silence = silence;
                        return watchManager<Manager>(options, steps);
                    });
}

/// A command with one number, which it hands to an operation; "NAME" prints "WHAT n NAMEd". The
/// operand is called as what it numbers is, in capitals.
template <typename Manager>
void addManagerNumberCommand(CLI::App& manager, Action& action, const char* name, const char* help,
                             const char* operand, const char* what, const char* operationName,
                             int (Manager::Client::*operation)(int)) {
    auto number = std::make_shared<int>(0);
    Command(manager, action, name, help)
            .number(operand, *number, std::string("The ") + what + "'s number")
            .runs([=] {
                const std::string words = fmt::format("{} {}", what, *number);
                return operate<Manager>(
                        operationName,
                        [&](typename Manager::Client& client) {
                            return (client.*operation)(*number);
                        },
                        fmt::format("{} {}d", words, name),
                        JsonObject().add(what, *number).addFlag(std::string(name) + "d", true),
                        words);
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

/// Where to look for what can be set and not be asked for.
constexpr const char* kStateIsInInfo =
        "No interface tells the setting in force; \"zelkctl info\" shows what the simulated stack "
        "tells of it.";

/// A command that takes one of two words, with what a manager does for each.
template <typename Manager>
void addSwitchCommand(CLI::App& manager, Action& action, const char* name, const char* help,
                      SwitchWord<typename Manager::Client> on,
                      SwitchWord<typename Manager::Client> off) {
    using Client = typename Manager::Client;
    auto word = std::make_shared<std::string>();
    Command(manager, action, name, help)
            .choice(*word, {on.word, off.word}, "What to do with it")
            .details(kStateIsInInfo)
            .runs([=] {
                const SwitchWord<Client>& chosen = *word == on.word ? on : off;
                return operate<Manager>(
                        chosen.operationName,
                        [&](Client& client) { return (client.*chosen.operation)(); }, chosen.done,
                        JsonObject().addFlag(name, *word == on.word));
            });
}

}  // namespace pemaro::zelkctl
