// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

/// The gesture record of the simulated touch and gesture managers, 72,144 bytes, little-endian. The
/// library and its users carry it unseen.
///
///   offset  size  field
///        0     4  magic: "ZTGR"
///        4     2  version: 1
///        6     2  headerBytes: 48
///        8     4  length: 72144
///       12     4  sequence: of the service that reports it, from 0
///       16     8  timeNs: CLOCK_MONOTONIC of the service, nanoseconds
///       24     4  checksum: CRC-32 (the one of zlib) of the whole record with this field 0
///       28     4  gesture: its number; 1 to 8 are the shapes of Stroke.h, user-defined ones follow
///       32     4  feature: of the touch manager that it belongs to; 0 from the gesture manager
///       36     4  flags: kGesture... bits
///       40     4  pointCount
///       44     4  reserved: 0
///       48     .  6008 points of 12 bytes each: GesturePoint; those after pointCount are 0
///
/// Up to the checksum the fields are those of a frame.
namespace pemaro::simulator {

constexpr uint32_t kGestureMagic = 0x5247545A;
constexpr uint16_t kGestureVersion = 1;
constexpr uint32_t kGestureMaxPoints = 6008;

constexpr uint32_t kGestureWakeup = 1;        ///< it woke the device
constexpr uint32_t kGestureRegionOn = 2;      ///< a region was configured
constexpr uint32_t kGestureInsideRegion = 4;  ///< and the middle of the gesture lies in it

struct GesturePoint {
    uint32_t timeMs;  ///< since the gesture's first point
    uint16_t x;
    uint16_t y;
    uint16_t pressure;
    uint16_t finger;
};
static_assert(sizeof(GesturePoint) == 12, "gesture record layout");

struct GestureRecord {
    uint32_t magic;
    uint16_t version;
    uint16_t headerBytes;
    uint32_t length;
    uint32_t sequence;
    uint64_t timeNs;
    uint32_t checksum;
    int32_t gesture;
    int32_t feature;
    uint32_t flags;
    uint32_t pointCount;
    uint32_t reserved;
    GesturePoint points[kGestureMaxPoints];
};
static_assert(sizeof(GestureRecord) == 72144, "gesture record layout");
static_assert(offsetof(GestureRecord, checksum) == 24, "gesture record layout");
static_assert(offsetof(GestureRecord, points) == 48, "gesture record layout");

/// Fills in the fields that are the same in every record, the time, and last the checksum.
void sealGestureRecord(GestureRecord* record);

/// Copies a record, of whatever alignment, after a look at it; null for one that is not intact.
std::shared_ptr<const GestureRecord> readGestureRecord(const void* record);

/// What a gesture is called that the panel knows by itself, like "swipe right"; empty for another.
const char* gestureName(int gesture);

}  // namespace pemaro::simulator
