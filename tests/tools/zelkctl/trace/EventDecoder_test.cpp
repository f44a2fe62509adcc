// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/EventDecoder.h"

#include <fmt/core.h>
#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

namespace pemaro::zelkctl {

namespace {

constexpr int kId = 1382;

// A field of an event, and what a record holds in it.
struct Field {
    const char* type;
    const char* name;
    unsigned offset;
    unsigned size;
    uint64_t value;
};

// What all events begin with.
const std::vector<Field> kCommon = {{"unsigned short", "common_type", 0, 2, kId},
                                    {"unsigned char", "common_flags", 2, 1, 0},
                                    {"unsigned char", "common_preempt_count", 3, 1, 0},
                                    {"int", "common_pid", 4, 4, 147}};

// Describes an event to libtraceevent as a kernel's file "format" does, and makes a record of it.
class RecordedEvent {
  public:
    RecordedEvent(const std::string& name, const std::vector<Field>& own) {
        std::string format = fmt::format("name: {}\nID: {}\nformat:\n", name, kId);
        for (const auto* fields : {&kCommon, &own}) {
            for (const Field& field : *fields) {
                format += fmt::format("\tfield:{} {};\toffset:{};\tsize:{};\tsigned:{};\n",
                                      field.type, field.name, field.offset, field.size,
                                      strncmp(field.type, "int", 4) == 0 ? 1 : 0);
                mBytes.resize(std::max<size_t>(mBytes.size(), field.offset + field.size));
                memcpy(&mBytes[field.offset], &field.value, field.size);
            }
            format += "\n";
        }
        format += "print fmt: \"\"\n";
        tep_set_file_bigendian(mFormats.get(), TEP_LITTLE_ENDIAN);
        tep_set_local_bigendian(mFormats.get(), TEP_LITTLE_ENDIAN);
        EXPECT_EQ(0, tep_parse_event(mFormats.get(), format.data(), format.size(), "binder"));
        mRecord.ts = 19'546'165'000;
        mRecord.data = mBytes.data();
        mRecord.size = static_cast<int>(mBytes.size());
    }

    bool decode(BinderEvent* event) {
        return decodeEvent(*tep_find_event(mFormats.get(), kId), mRecord, event);
    }

  private:
    const std::unique_ptr<tep_handle, decltype(&tep_free)> mFormats{tep_alloc(), &tep_free};
    std::vector<uint8_t> mBytes;
    tep_record mRecord{};
};

const std::vector<Field> kTransaction = {
        {"int", "debug_id", 8, 4, 53},      {"int", "target_node", 12, 4, 6},
        {"int", "to_proc", 16, 4, 137},     {"int", "to_thread", 20, 4, 143},
        {"int", "reply", 24, 4, 1},         {"unsigned int", "code", 28, 4, 0x5F504E47},
        {"unsigned int", "flags", 32, 4, 8}};

}  // namespace

TEST(EventDecoder, ReadsATransaction) {
    BinderEvent event;
    ASSERT_TRUE(RecordedEvent("binder_transaction", kTransaction).decode(&event));
    EXPECT_EQ(BinderEvent::Kind::kSent, event.kind);
    EXPECT_EQ(19'546'165'000, event.time);
    EXPECT_EQ(147, event.thread);
    EXPECT_EQ(53, event.number);
    EXPECT_EQ(6, event.object);
    EXPECT_EQ(137, event.process);
    EXPECT_EQ(143, event.toThread);
    EXPECT_TRUE(event.isReply);
    EXPECT_EQ(0x5F504E47u, event.code);
    EXPECT_EQ(8u, event.flags);
}

TEST(EventDecoder, ReadsWhatElseHappensToIt) {
    BinderEvent event;
    ASSERT_TRUE(RecordedEvent("binder_transaction_received", {{"int", "debug_id", 8, 4, 53}})
                        .decode(&event));
    EXPECT_EQ(BinderEvent::Kind::kReceived, event.kind);
    EXPECT_EQ(53, event.number);

    ASSERT_TRUE(RecordedEvent("binder_transaction_alloc_buf",
                              {{"int", "debug_id", 8, 4, 54},
                               {"size_t", "data_size", 16, 8, 0x123456789}})
                        .decode(&event));
    EXPECT_EQ(BinderEvent::Kind::kBuffer, event.kind);
    EXPECT_EQ(54, event.number);
    EXPECT_EQ(0x123456789u, event.size);

    for (const char* name : {"binder_transaction_node_to_ref", "binder_transaction_ref_to_ref"}) {
        ASSERT_TRUE(RecordedEvent(name, {{"int", "debug_id", 8, 4, 55},
                                         {"int", "node_debug_id", 12, 4, 9}})
                            .decode(&event));
        EXPECT_EQ(BinderEvent::Kind::kNode, event.kind);
        EXPECT_EQ(55, event.number);
        EXPECT_EQ(9, event.object);
    }

    ASSERT_TRUE(RecordedEvent("binder_return", {{"uint32_t", "cmd", 8, 4, 0x7205}}).decode(&event));
    EXPECT_EQ(BinderEvent::Kind::kReturn, event.kind);
    EXPECT_EQ(0x7205u, event.command);
}

// Another kernel may have other offsets, and fields that we do not know.
TEST(EventDecoder, GoesByTheFieldsNames) {
    std::vector<Field> fields = kTransaction;
    fields.push_back({"int", "reply_to", 8, 4, 1});
    for (size_t i = 0; i + 1 < fields.size(); ++i) {
        fields[i].offset += 4;
    }
    BinderEvent event;
    ASSERT_TRUE(RecordedEvent("binder_transaction", fields).decode(&event));
    EXPECT_EQ(53, event.number);
    EXPECT_EQ(8u, event.flags);
}

TEST(EventDecoder, RefusesWhatItDoesNotKnow) {
    BinderEvent event;
    EXPECT_FALSE(RecordedEvent("binder_lock", {{"int", "debug_id", 8, 4, 53}}).decode(&event));
    for (size_t missing = 0; missing < kTransaction.size(); ++missing) {
        std::vector<Field> fields = kTransaction;
        fields.erase(fields.begin() + static_cast<long>(missing));
        EXPECT_FALSE(RecordedEvent("binder_transaction", fields).decode(&event))
                << kTransaction[missing].name;
    }
}

// The numbers of <linux/android/binder.h>, which are the kernel's own and do not change.
TEST(EventDecoder, HasTheKernelLeaveOutReturnsThatEndNoCall) {
    EXPECT_EQ("cmd == 29189 || cmd == 29201 || cmd == 29202", returnFilter());
}

}  // namespace pemaro::zelkctl
