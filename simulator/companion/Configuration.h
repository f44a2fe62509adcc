// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "pemaro/SerializableMap.h"

namespace pemaro::simulator {

/// The configuration of the simulated touch stack: named values, and a calibration table with a
/// baseline for each cell of the sensor.
///
/// A file holds the named values in the text form of a map.
/// The binary form holds everything, little-endian:
///
///   offset  size  field
///        0     4  magic: "ZCFG"
///        4     4  version: 1
///        8     4  length: bytes of the whole
///       12     4  checksum: CRC-32 (the one of zlib) of the whole with this field 0
///       16     4  textBytes
///       20     4  cells
///       24     .  the named values in the text form of a map, textBytes
///        .     .  cells x 2 bytes: the calibration table, signed
///
/// The keys are fixed, and a value replaced by an unknown key is refused. Every operation returns a
/// status of Status.h and changes nothing when it fails.
class Configuration {
  public:
    Configuration();

    /// Gives each key of `wanted` its value.
    int get(SerializableMap& wanted) const;

    std::vector<std::string> keys() const;

    /// Takes new values for some keys.
    int set(const SerializableMap& changes);

    int save(const std::string& path) const;
    int load(const std::string& path);

    std::string toBinary() const;
    int fromBinary(const void* data, size_t size);

    /// Fills the calibration table anew, with a pattern that `seed` chooses.
    void calibrate(uint32_t seed);

  private:
    SerializableMap mValues;
    std::vector<int16_t> mCalibration;
};

}  // namespace pemaro::simulator
