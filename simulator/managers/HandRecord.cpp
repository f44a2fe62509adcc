// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/HandRecord.h"

#include <cstring>

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

}  // namespace pemaro::simulator
