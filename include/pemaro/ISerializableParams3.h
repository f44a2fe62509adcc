// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/Export.h"

namespace pemaro {

/// The older form of ISerializableParams4, without a lookup by key: class identifier 3, made by
/// VEXPemaroCreateInstance(3, 0x30000, ...), destroyed with `delete`. The order of the declarations
/// is binding.
class ZELK_API ISerializableParams3 {
  public:
    virtual ~ISerializableParams3() = default;

    /// 3.
    virtual int getClassID() = 0;

    /// The number of entries.
    virtual int size() = 0;

    /// ISerializableParams4::getKeyAt().
    virtual int getKey(int index, std::string& key) = 0;

    /// ISerializableParams4::getValueAt().
    virtual int getValue(int index, std::string& value) = 0;

    /// ISerializableParams4::setValue().
    virtual int setParam(std::string& key, std::string& value) = 0;
};

}  // namespace pemaro
