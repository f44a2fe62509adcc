// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>

#include "frames/Frame.h"
#include "simulator/time/MonotonicTime.h"

namespace pemaro::simulator {

// What all records of the managers begin with, field for field as a frame does,
// so that a frame's checksum serves them too.

/// Fills in what is the same in every record of a kind, the time, and last the checksum.
template <typename Record>
void sealRecord(uint32_t magic, uint16_t version, size_t headerBytes, Record* record) {
    static_assert(offsetof(Record, checksum) == offsetof(frames::FrameHeader, checksum),
                  "record layout");
    record->magic = magic;
    record->version = version;
    record->headerBytes = static_cast<uint16_t>(headerBytes);
    record->length = sizeof(*record);
    record->timeNs = monotonicTimeNs();
    record->checksum = frames::frameChecksum(record, sizeof(*record));
}

/// Copies a record, of whatever alignment; null for one that is not intact or of another kind.
template <typename Record>
std::shared_ptr<const Record> readSealedRecord(uint32_t magic, uint16_t version,
                                               const void* record) {
    auto copy = std::make_shared<Record>();
    memcpy(copy.get(), record, sizeof(*copy));
    const bool intact = copy->magic == magic && copy->version == version &&
                        copy->length == sizeof(*copy) &&
                        copy->checksum == frames::frameChecksum(copy.get(), sizeof(*copy));
    return intact ? copy : nullptr;
}

}  // namespace pemaro::simulator
