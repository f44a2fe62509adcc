// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/CallText.h"

#include <fmt/core.h>

#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

struct EndText {
    CallEnd end;
    const char* word;
    const char* sentence;
};

constexpr EndText kEnds[] = {
        {CallEnd::kAnswered, "answered", ""},
        {CallEnd::kRefused, "refused", "FAILED: answered by an error in place of a reply"},
        {CallEnd::kOneWay, "one-way", "one way"},
        {CallEnd::kDead, "dead", "FAILED: the process that was called ended"},
        {CallEnd::kUndelivered, "undelivered", "FAILED: the driver could not deliver it"},
        {CallEnd::kOpen, "open", "no answer was seen"},
};

const EndText& textOf(CallEnd end) {
    return *std::find_if(std::begin(kEnds), std::end(kEnds),
                         [end](const EndText& row) { return row.end == end; });
}

std::string partyText(const Party& party) {
    return party.process == 0 ? fmt::format("{} (thread {})", party.name, party.thread)
                              : fmt::format("{} {}", party.name, party.process);
}

void addParty(JsonObject& object, const char* name, const Party& party) {
    JsonObject member;
    member.add("name", party.name);
    if (party.process != 0) {
        member.add("process", party.process);
    }
    if (party.thread != 0) {
        member.add("thread", party.thread);
    }
    object.add(name, member);
}

}  // namespace

std::string callName(const TracedCall& call) {
    return fmt::format("{}.{}", call.interface->word, operationName(*call.interface, call.code));
}

const char* callEndWord(CallEnd end) {
    return textOf(end).word;
}

double secondsOf(int64_t nanoseconds) {
    return static_cast<double>(nanoseconds) / 1e9;
}

std::string millisecondsText(int64_t nanoseconds) {
    return fmt::format("{:.3f} ms", static_cast<double>(nanoseconds) / 1e6);
}

std::string callLine(const TracedCall& call, std::chrono::system_clock::time_point when,
                     const Party& caller, const Party& callee) {
    std::string line = fmt::format("{}  {} > {}  {}  {}", timeOfDay(when), partyText(caller),
                                   partyText(callee), callName(call), call.requestBytes);
    line += call.end == CallEnd::kAnswered ? fmt::format(" > {} bytes", call.replyBytes) : " bytes";
    if (call.isTimed()) {
        line += "  " + millisecondsText(call.took());
    }
    const std::string sentence = textOf(call.end).sentence;
    return sentence.empty() ? line : line + "  " + sentence;
}

std::string callJson(const TracedCall& call, std::chrono::system_clock::time_point when,
                     const Party& caller, const Party& callee) {
    JsonObject object;
    object.addTime("time", when)
            .add("service", call.interface->word)
            .add("interface", call.interface->descriptor)
            .add("operation", operationName(*call.interface, call.code))
            .add("code", static_cast<int64_t>(call.code));
    addParty(object, "from", caller);
    addParty(object, "to", callee);
    object.add("outcome", callEndWord(call.end))
            .add("request", static_cast<int64_t>(call.requestBytes));
    if (call.end == CallEnd::kAnswered) {
        object.add("reply", static_cast<int64_t>(call.replyBytes));
    }
    if (call.isTimed()) {
        object.addReal("seconds", secondsOf(call.took()));
    }
    if (call.received != 0 && call.replied != 0) {
        object.addReal("serving", secondsOf(call.replied - call.received));
    }
    return object.text();
}

}  // namespace pemaro::zelkctl
