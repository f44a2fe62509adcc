// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/GestureRecord.h"

#include "simulator/managers/RecordSeal.h"

namespace pemaro::simulator {

void sealGestureRecord(GestureRecord* record) {
    sealRecord(kGestureMagic, kGestureVersion, offsetof(GestureRecord, points), record);
}

std::shared_ptr<const GestureRecord> readGestureRecord(const void* record) {
    auto copy = readSealedRecord<GestureRecord>(kGestureMagic, kGestureVersion, record);
    const bool intact = copy != nullptr && copy->pointCount <= kGestureMaxPoints;
    return intact ? copy : nullptr;
}

}  // namespace pemaro::simulator
