// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/Timeline.h"

#include <utility>

#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/trace/CallText.h"

namespace pemaro::zelkctl {
namespace {

constexpr const char* kCategory = "binder";

/// A process that is not known is shown as one of its thread alone.
int shownProcess(const Party& party) {
    return party.process != 0 ? party.process : party.thread;
}

double microseconds(int64_t nanoseconds) {
    return static_cast<double>(nanoseconds) / 1e3;
}

/// What all events begin with: what kind, called how, on which thread, when.
JsonObject& beginEvent(JsonObject& event, const char* kind, const std::string& name,
                       const Party& party, int64_t when) {
    return event.add("ph", kind)
            .add("cat", kCategory)
            .add("name", name)
            .add("pid", shownProcess(party))
            .add("tid", party.thread)
            .addReal("ts", microseconds(when));
}

JsonObject& addArguments(JsonObject& event, const TracedCall& call) {
    JsonObject arguments;
    arguments.add("interface", call.interface->descriptor)
            .add("code", static_cast<int64_t>(call.code))
            .add("outcome", callEndWord(call.end))
            .add("request", static_cast<int64_t>(call.requestBytes))
            .add("reply", static_cast<int64_t>(call.replyBytes))
            .add("transaction", call.number);
    return event.add("args", arguments);
}

std::string slice(const TracedCall& call, const Party& party, int64_t from, int64_t to) {
    JsonObject event;
    beginEvent(event, "X", callName(call), party, from).addReal("dur", microseconds(to - from));
    return addArguments(event, call).text();
}

}  // namespace

std::string Timeline::add(const TracedCall& call, const Party& caller, const Party& callee) {
    begin();
    nameProcess(caller);
    nameProcess(callee);
    // Without an end, a slice has the length of what is known of it.
    const int64_t replied = std::max(call.replied, call.received);
    append(slice(call, caller, call.sent, std::max({call.sent, replied, call.returned})));
    if (call.received != 0) {
        const int64_t done = call.replied == 0 ? call.returned : call.replied;
        append(slice(call, callee, call.received, std::max(call.received, done)));
        JsonObject tail;
        append(beginEvent(tail, "s", "call", caller, call.sent).add("id", call.number).text());
        JsonObject head;
        append(beginEvent(head, "f", "call", callee, call.received)
                       .add("id", call.number)
                       .add("bp", "e")
                       .text());
    }
    return std::exchange(mPiece, "");
}

std::string Timeline::end() {
    begin();
    return std::exchange(mPiece, "") + "\n]}\n";
}

void Timeline::begin() {
    if (!mHasBegun) {
        mPiece = R"({"displayTimeUnit":"ms","traceEvents":[)";
    }
    mHasBegun = true;
}

void Timeline::append(const std::string& event) {
    mPiece += (mHasEvents ? ",\n" : "\n") + event;
    mHasEvents = true;
}

void Timeline::nameProcess(const Party& party) {
    if (!mNamed.insert(shownProcess(party)).second) {
        return;
    }
    JsonObject arguments;
    arguments.add("name", party.name);
    JsonObject event;
    append(event.add("ph", "M")
                   .add("name", "process_name")
                   .add("pid", shownProcess(party))
                   .add("tid", party.thread)
                   .add("args", arguments)
                   .text());
}

}  // namespace pemaro::zelkctl
