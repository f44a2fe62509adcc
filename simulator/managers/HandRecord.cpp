// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/HandRecord.h"

#include <cstring>
#include <iterator>

#include "simulator/managers/RecordSeal.h"

namespace pemaro::simulator {

void sealHandRecord(HandRecord* record) {
    sealRecord(kHandMagic, kHandVersion, offsetof(HandRecord, profile) + sizeof(record->profile),
               record);
}

std::shared_ptr<const HandRecord> readHandRecord(const void* record) {
    auto copy = readSealedRecord<HandRecord>(kHandMagic, kHandVersion, record);
    const bool intact = copy != nullptr && memchr(copy->profile, 0, sizeof(copy->profile));
    return intact ? copy : nullptr;
}

const char* handEventName(HandEvent event) {
    constexpr const char* kNames[] = {"enrollment started",
                                      "enrollment progress",
                                      "enrollment done",
                                      "enrollment stopped",
                                      "scan started",
                                      "scan done",
                                      "matching started",
                                      "hand detected",
                                      "matched",
                                      "not matched",
                                      "matching stopped",
                                      "cancelled",
                                      "wake-up"};
    const auto number = static_cast<uint32_t>(event);
    return number >= 1 && number <= std::size(kNames) ? kNames[number - 1] : "";
}

}  // namespace pemaro::simulator
