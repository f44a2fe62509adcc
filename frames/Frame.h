// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>

/// A recorded frame of the simulated touch stack, little-endian:
///
///   offset  size  field
///        0     4  magic: "ZTFR"
///        4     2  version: 1
///        6     2  headerBytes: 40
///        8     4  length: bytes of the whole frame, the header included
///       12     4  sequence: 0 for the first frame of a recording, one more for each frame produced
///       16     8  timeNs: CLOCK_MONOTONIC of the service, nanoseconds
///       24     4  checksum: CRC-32 (the one of zlib) of the whole frame with this field 0
///       28     4  filter: the record filter in force, kFilter... bits
///       32     2  columns
///       34     2  rows
///       36     2  fingers
///       38     2  reserved: 0
///       40     .  fingers x 8 bytes: FingerRecord, if kFilterFingers is set
///        .     .  rows x columns x 2 bytes: the image, if kFilterImage is set; signed capacitance
///                 changes, row by row
///
/// What the record filter leaves out is absent and its count is 0. The library fixes only the length
/// at byte 8. A frame that found no room in the ring still takes its sequence number, so that a
/// reader sees every loss as a gap.
namespace pemaro::frames {

constexpr uint32_t kFrameMagic = 0x5246545A;
constexpr uint16_t kFrameVersion = 1;
constexpr uint32_t kFilterImage = 1;
constexpr uint32_t kFilterFingers = 2;
constexpr uint32_t kFilterDefault = kFilterImage | kFilterFingers;

struct FrameHeader {
    uint32_t magic;
    uint16_t version;
    uint16_t headerBytes;
    uint32_t length;
    uint32_t sequence;
    uint64_t timeNs;
    uint32_t checksum;
    uint32_t filter;
    uint16_t columns;
    uint16_t rows;
    uint16_t fingers;
    uint16_t reserved;
};
static_assert(sizeof(FrameHeader) == 40, "frame layout");
static_assert(offsetof(FrameHeader, length) == 8, "frame layout");
static_assert(offsetof(FrameHeader, checksum) == 24, "frame layout");

/// A finger: its number, its position from 0 to 65535 across the panel, its peak in the image.
struct FingerRecord {
    uint16_t id;
    uint16_t x;
    uint16_t y;
    int16_t peak;
};
static_assert(sizeof(FingerRecord) == 8, "frame layout");

/// The checksum that belongs into a frame of `length` bytes. REQUIRES: a whole header.
uint32_t frameChecksum(const void* frame, size_t length);

/// Copies the header out. False when `length` bytes hold none or it is of another kind of frame.
bool readFrameHeader(const void* frame, size_t length, FrameHeader* header);

/// Null for a header that a frame of `length` bytes can have, else what is wrong with it.
const char* frameHeaderFault(const FrameHeader& header, uint64_t length);

/// What is wrong with a frame that has another checksum than its header tells.
constexpr const char* kWrongChecksum = "wrong checksum";

/// Null for an intact frame of `length` bytes, else what is wrong with it.
const char* frameFault(const void* frame, size_t length);

}  // namespace pemaro::frames
