// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/GestureRecord.h"

#include <iterator>

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

const char* gestureName(int gesture) {
    constexpr const char* kNames[] = {"swipe right", "swipe left", "swipe up", "swipe down",
                                      "circle",      "V",          "Z",        "square"};
    constexpr int kCount = static_cast<int>(std::size(kNames));
    return gesture >= 1 && gesture <= kCount ? kNames[gesture - 1] : "";
}

}  // namespace pemaro::simulator
