// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

struct Event {
    int64_t type = 0;
    int64_t param = 0;
};

int sendEvent(const Event& event) {
    const std::string words = fmt::format("event {} with {}", event.type, event.param);
    return operateClient(
            "sendEvent",
            [&](TouchCompanionClient& client) {
                return client.sendEvent(static_cast<eventType>(static_cast<int32_t>(event.type)),
                                        static_cast<eventParam>(static_cast<int32_t>(event.param)));
            },
            words + " sent", JsonObject().add("type", event.type).add("param", event.param), words);
}

}  // namespace

void addEventCommand(CLI::App& app, Action& action) {
    auto event = std::make_shared<Event>();
    Command(app, action, "event", "Hand an event to the service")
            .number("TYPE", event->type, "A number that the service defines", tools::kAny32)
            .number("PARAM", event->param, "A number that the service defines", tools::kAny32)
            .runs([event] { return sendEvent(*event); });
}

}  // namespace pemaro::zelkctl
