// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/Export.h"

namespace pemaro {

/// Configuration parameters as texts, carried between a caller and a companion facade: class
/// identifier 4, made by VEXPemaroCreateInstance(4, 0x40000, ...), destroyed with `delete`.
///
/// Callers reach the operations through their positions in the table of virtual functions: the
/// order of the declarations is binding. Entries are sorted by key.
class ZELK_API ISerializableParams4 {
  public:
    virtual ~ISerializableParams4() = default;

    /// 4.
    virtual int getClassID() = 0;

    /// The number of entries.
    virtual int size() = 0;

    /// Copies the key at a position: 0, or 0x4000000D and `key` as it was for a bad position.
    virtual int getKeyAt(int index, std::string& key) = 0;

    /// Copies the text of the value at a position: 0, or 0x4000000C for a map, an array, a blob or
    /// a null value. A bad position is fatal.
    virtual int getValueAt(int index, std::string& value) = 0;

    /// Copies the text of the value under `key`, as getValueAt(). An absent key is fatal.
    virtual int getValue(const std::string& key, std::string& value) = 0;

    /// Stores `value`, whatever it looks like as a string, under `key`. 0, or 0x40000000 when it
    /// could not be stored.
    virtual int setValue(std::string& key, std::string& value) = 0;
};

}  // namespace pemaro
