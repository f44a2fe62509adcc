// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/EventDecoder.h"

#include <fmt/core.h>
#include <linux/android/binder.h>

#include <algorithm>
#include <cstring>
#include <initializer_list>

namespace pemaro::zelkctl {
namespace {

using Kind = BinderEvent::Kind;

struct EventKind {
    const char* name;
    Kind kind;
};

constexpr EventKind kEvents[] = {
        {"binder_transaction", Kind::kSent},
        {"binder_transaction_received", Kind::kReceived},
        {"binder_transaction_alloc_buf", Kind::kBuffer},
        // The sender's own object, and one that it holds of another process.
        {"binder_transaction_node_to_ref", Kind::kNode},
        {"binder_transaction_ref_to_ref", Kind::kNode},
        {"binder_return", Kind::kReturn},
};

/// Reads fields one after another, until one is not there.
class Fields {
  public:
    Fields(tep_event& event, tep_record& record) : mEvent(event), mRecord(record) {}

    template <typename Number>
    Fields& read(const char* name, Number* value) {
        unsigned long long number = 0;
        mGood = mGood && tep_get_any_field_val(nullptr, &mEvent, name, &mRecord, &number, 0) == 0;
        *value = static_cast<Number>(number);
        return *this;
    }

    bool isGood() const { return mGood; }

  private:
    tep_event& mEvent;
    tep_record& mRecord;
    bool mGood = true;
};

}  // namespace

const std::vector<std::string>& readEvents() {
    static const std::vector<std::string> names = [] {
        std::vector<std::string> list;
        for (const EventKind& event : kEvents) {
            list.emplace_back(event.name);
        }
        return list;
    }();
    return names;
}

std::string returnFilter() {
    return fmt::format("cmd == {} || cmd == {} || cmd == {}", static_cast<uint32_t>(BR_DEAD_REPLY),
                       static_cast<uint32_t>(BR_FAILED_REPLY),
                       static_cast<uint32_t>(BR_FROZEN_REPLY));
}

bool decodeEvent(tep_event& event, tep_record& record, BinderEvent* decoded) {
    const auto* known =
            std::find_if(std::begin(kEvents), std::end(kEvents),
                         [&event](const EventKind& row) { return !strcmp(row.name, event.name); });
    if (known == std::end(kEvents)) {
        return false;
    }
    *decoded = {};
    decoded->kind = known->kind;
    decoded->time = static_cast<int64_t>(record.ts);
    Fields fields(event, record);
    fields.read("common_pid", &decoded->thread);
    if (known->kind == Kind::kReturn) {
        return fields.read("cmd", &decoded->command).isGood();
    }
    fields.read("debug_id", &decoded->number);
    switch (known->kind) {
        case Kind::kSent:
            fields.read("target_node", &decoded->object)
                    .read("to_proc", &decoded->process)
                    .read("to_thread", &decoded->toThread)
                    .read("reply", &decoded->isReply)
                    .read("code", &decoded->code)
                    .read("flags", &decoded->flags);
            break;
        case Kind::kBuffer:
            fields.read("data_size", &decoded->size);
            break;
        case Kind::kNode:
            fields.read("node_debug_id", &decoded->object);
            break;
        default:
            break;
    }
    return fields.isGood();
}

}  // namespace pemaro::zelkctl
