// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "simulator/managers/HandImage.h"

/// The event record of the simulated hand biometric manager, 10,016 bytes, little-endian. The library
/// and its users carry it unseen.
///
///   offset  size  field
///        0     4  magic: "ZTHR"
///        4     2  version: 1
///        6     2  headerBytes: 96
///        8     4  length: 10016
///       12     4  sequence: from 0
///       16     8  timeNs: CLOCK_MONOTONIC of the service, nanoseconds
///       24     4  checksum: CRC-32 (the one of zlib) of the whole record with this field 0
///       28     4  event: a HandEvent
///       32     4  progress: of an enrollment, in percent
///       36     4  score: of a match, how alike the hand and the best profile are, 0 to 100
///       40     4  security: the level in force
///       44     4  reserved: 0
///       48    48  profile: the name of the profile enrolled or matched, ended by a 0; else empty
///       96  9920  image: HandImage of the hand on the panel; 0 where there is none
///
/// Up to the checksum the fields are those of a frame.
namespace pemaro::simulator {

constexpr uint32_t kHandMagic = 0x5248545A;
constexpr uint16_t kHandVersion = 1;

///     enrollment   kEnrollmentStarted, kEnrollmentProgress (20 to 100 percent), then
///                  kEnrollmentDone, unless it was stopped: kEnrollmentStopped
///     scan         kScanStarted, then kScanDone
///     matching     kMatchingStarted, then for each hand kHandDetected and kMatched or kNotMatched,
///                  until kMatchingStopped
///     cancelled    kCancelled in place of what would have come
///     idle         kWakeup now and then, while wake-up is on
enum class HandEvent : uint32_t {
    kEnrollmentStarted = 1,
    kEnrollmentProgress = 2,
    kEnrollmentDone = 3,
    kEnrollmentStopped = 4,
    kScanStarted = 5,
    kScanDone = 6,
    kMatchingStarted = 7,
    kHandDetected = 8,
    kMatched = 9,
    kNotMatched = 10,
    kMatchingStopped = 11,
    kCancelled = 12,
    kWakeup = 13,
};

struct HandRecord {
    uint32_t magic;
    uint16_t version;
    uint16_t headerBytes;
    uint32_t length;
    uint32_t sequence;
    uint64_t timeNs;
    uint32_t checksum;
    HandEvent event;
    uint32_t progress;
    uint32_t score;
    int32_t security;
    uint32_t reserved;
    char profile[48];
    HandImage image;
};
static_assert(sizeof(HandRecord) == 10016, "hand record layout");
static_assert(offsetof(HandRecord, checksum) == 24, "hand record layout");
static_assert(offsetof(HandRecord, profile) == 48, "hand record layout");
static_assert(offsetof(HandRecord, image) == 96, "hand record layout");

/// Fills in the fields that are the same in every record, the time, and last the checksum.
void sealHandRecord(HandRecord* record);

/// Copies a record, of whatever alignment, after a look at it; null for one that is not intact.
std::shared_ptr<const HandRecord> readHandRecord(const void* record);

/// What an event is called, like "enrollment progress"; empty for one that there is not.
const char* handEventName(HandEvent event);

}  // namespace pemaro::simulator
