// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "tests/support/ParcelBytes.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {

// What the managers' requests and replies are made of.

inline constexpr char kTouch[] = "TouchManagerService";
inline constexpr char kGesture[] = "GestureManagerService";
inline constexpr char kHand[] = "HandBiometricManagerService";

// The codes that the managers have in common.
inline constexpr uint32_t kSubscribe = 1;
inline constexpr uint32_t kUnsubscribe = 2;

// Where an operation leaves what it answers, when only its result counts.
inline bool gAnswer;
inline int gResult;
inline unsigned int gCount;
inline std::vector<std::string> gNames;

inline ParcelWriter numbers(std::vector<int32_t> values) {
    return [values](android::Parcel& parcel) {
        for (int32_t value : values) {
            parcel.writeInt32(value);
        }
    };
}

inline ParcelWriter names(std::vector<const char*> values) {
    return [values](android::Parcel& parcel) {
        for (const char* value : values) {
            parcel.writeCString(value);
        }
    };
}

/// The codes of the transactions that reached `remote`, in order.
inline std::vector<uint32_t> codesOf(const android::sp<RecordingBinder>& remote) {
    std::vector<uint32_t> codes;
    for (const RecordingBinder::Transaction& transaction : remote->transactions()) {
        codes.push_back(transaction.code);
    }
    return codes;
}

/// `count` records whose bytes tell where they are.
template <typename Record>
std::vector<Record> makeRecords(size_t count) {
    std::vector<Record> records(count);
    uint8_t* bytes = reinterpret_cast<uint8_t*>(records.data());
    for (size_t i = 0; i < count * sizeof(Record); ++i) {
        bytes[i] = static_cast<uint8_t>(i * 31 + i / 251);
    }
    return records;
}

/// Whether `records` points to the first `count` records of makeRecords().
template <typename Record>
bool holdsRecords(const Record* records, size_t count) {
    if (records == nullptr) {
        return false;
    }
    const std::vector<Record> expected = makeRecords<Record>(count);
    return count == 0 || memcmp(records, expected.data(), count * sizeof(Record)) == 0;
}

/// Appends makeRecords() as raw bytes.
template <typename Record>
void writeRecords(android::Parcel& parcel, size_t count) {
    parcel.write(makeRecords<Record>(count).data(), count * sizeof(Record));
}

}  // namespace pemaro::test
