// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/Export.h"
#include "pemaro/ISerializableParams4.h"

namespace pemaro {

/// The older form of ITouchCompanionFacade, without record filter and commands: class identifier
/// 1792, made by VEXPemaroCreateInstance(1792, 0x7000000, ...), destroyed with `delete`. The order
/// of the declarations is binding.
class ZELK_API ITouchCompanionFacadeOld {
  public:
    virtual ~ITouchCompanionFacadeOld() = default;

    /// 1792.
    virtual int getClassID() = 0;

    /// As the operations of ITouchCompanionFacade with the same names.
    virtual int init(void (*callback)(int, void*, unsigned long, void*), void* context) = 0;
    virtual int setRecordOutput(int output) = 0;
    virtual int startRecord() = 0;
    virtual int stopRecord() = 0;
    virtual int getConfigParams(ISerializableParams4* params) = 0;
    virtual int setConfigParams(ISerializableParams4* params) = 0;
    virtual int getConfigParams(void* buffer, unsigned long* len) = 0;
    virtual int setConfigParams(const void* data, unsigned long size) = 0;

    /// Not supported: always 0x4000000E, and both texts as they were.
    virtual int getFormatDescription(std::string& first, std::string& second) = 0;

    /// As the operations of ITouchCompanionFacade with the same names.
    virtual int getPacketSize() = 0;
    virtual int inspect(unsigned int* value) = 0;
};

}  // namespace pemaro
