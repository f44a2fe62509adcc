// SPDX-License-Identifier: Apache-2.0
#include <cstdlib>
#include <memory>
#include <string>

#include "tools/zelkctl/Commands.h"
#include "tools/zelkctl/Companion.h"
#include "tools/zelkctl/Json.h"
#include "tools/zelkctl/Number.h"

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

int setFilter(const std::string& text) {
    const auto mask = readNumber("filter", "MASK", text, kUnsigned32);
    if (!mask) {
        return tools::kExitFailure;
    }
    return withFacade([&](ITouchCompanionFacade& facade) {
        const int status = facade.setRecordFilter(static_cast<unsigned int>(*mask));
        if (status != STATUS_NO_ERROR) {
            return failStatus("setRecordFilter", status);
        }
        fmt::print("record filter {:#x}\n", *mask);
        return tools::kExitSuccess;
    });
}

int setProperty(const std::string& name, const std::string& value) {
    if (!checkNumbers("property set", value)) {
        return tools::kExitFailure;
    }
    return operateClient(
            "setProperty",
            [&](TouchCompanionClient& client) {
                return client.setProperty(name.c_str(), value.c_str());
            },
            fmt::format("{} set to {}", name, value), name);
}

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

int inspect(bool json) {
    return withFacade([json](ITouchCompanionFacade& facade) {
        unsigned int value = 0;
        const int status = facade.inspect(&value);
        if (status != STATUS_NO_ERROR) {
            return failStatus("inspect", status);
        }
        fmt::print("{}\n",
                   json ? JsonObject().add("value", value).text() : fmt::format("{:#010x}", value));
        return tools::kExitSuccess;
    });
}

int showPacketSize(bool json) {
    return withFacade([json](ITouchCompanionFacade& facade) {
        const int size = facade.getPacketSize();
        // A failure cannot be told from the size that has its number.
        if (size >= STATUS_UNKNOWN_ERROR) {
            return failStatus("getPacketSize", size);
        }
        fmt::print("{}\n",
                   json ? JsonObject().add("packetSize", size).text() : std::to_string(size));
        return tools::kExitSuccess;
    });
}

int authenticate(const std::string& text) {
    return operateClient(
            "setAuth", [&](TouchCompanionClient& client) { return client.setAuth(text.c_str()); },
            "authenticated");
}

void addCommandCommand(CLI::App& app, Action& action) {
    auto text = std::make_shared<std::string>();
    auto json = std::make_shared<bool>(false);
    CLI::App* command = app.add_subcommand("command", "Send a debug command, and print the answer");
    command->add_option("TEXT", *text, "The command's name and its numbers, as one argument")
            ->required();
    command->add_flag("--json", *json, "Print a JSON object");
    command->callback([=, &action] { action = [=] { return sendCommand(*text, *json); }; });
}

void addFilterCommand(CLI::App& app, Action& action) {
    auto mask = std::make_shared<std::string>();
    CLI::App* command = app.add_subcommand("filter", "Choose what recorded frames contain");
    command->add_option("MASK", *mask, "Bits that the service defines")->required();
    command->callback([=, &action] { action = [=] { return setFilter(*mask); }; });
}

void addPropertyCommand(CLI::App& app, Action& action) {
    auto name = std::make_shared<std::string>();
    auto value = std::make_shared<std::string>();
    CLI::App* property = app.add_subcommand("property", "Change a property");
    property->require_subcommand(0, 1);
    CLI::App* command = property->add_subcommand("set", "Set a property to a number");
    command->add_option("NAME", *name, "The property: setRollingLogSize")->required();
    command->add_option("VALUE", *value, "A number, or several in one argument")->required();
    command->callback([=, &action] { action = [=] { return setProperty(*name, *value); }; });
}

void addEventCommand(CLI::App& app, Action& action) {
    auto type = std::make_shared<std::string>();
    auto param = std::make_shared<std::string>();
    CLI::App* command = app.add_subcommand("event", "Hand an event to the service");
    command->add_option("TYPE", *type, "A number that the service defines")->required();
    command->add_option("PARAM", *param, "A number that the service defines")->required();
    command->callback([=, &action] { action = [=] { return sendEvent(*type, *param); }; });
}

void addQueryCommand(CLI::App& app, Action& action, const char* name, const char* help,
                     int (*query)(bool json)) {
    auto json = std::make_shared<bool>(false);
    CLI::App* command = app.add_subcommand(name, help);
    command->add_flag("--json", *json, "Print a JSON object");
    command->callback([=, &action] { action = [=] { return query(*json); }; });
}

void addAuthCommand(CLI::App& app, Action& action) {
    auto text = std::make_shared<std::string>();
    CLI::App* command = app.add_subcommand("auth", "Authenticate with the service");
    command->add_option("TEXT", *text, "What the service wants to hear")->required();
    command->callback([=, &action] { action = [=] { return authenticate(*text); }; });
}

}  // namespace

void addDeviceCommands(CLI::App& app, Action& action) {
    addCommandCommand(app, action);
    addFilterCommand(app, action);
    addPropertyCommand(app, action);
    addEventCommand(app, action);
    addQueryCommand(app, action, "inspect", "Print the service's inspection word", inspect);
    addQueryCommand(app, action, "packet-size", "Print the bytes of a frame", showPacketSize);
    addAuthCommand(app, action);
}

}  // namespace pemaro::zelkctl
