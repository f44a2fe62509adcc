// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"
#include "pemaro/ISerializableParams4.h"

namespace pemaro {

/// The touch companion client for callers that load the library by name: class identifier 2048,
/// made by VEXPemaroCreateInstance(2048, 0x8000000, ...), destroyed with `delete`.
///
/// Callers reach the operations through their positions in the table of virtual functions: the
/// order of the declarations is binding. Before the first init() only these may be called: init()
/// itself, getClassID(), the map form of setConfigParams(), and, with the null that they refuse,
/// the map form of getConfigParams() and sendCommand(). Whether init() succeeded is the status of
/// each operation itself. TouchCompanionClient tells what they return. One thread at a time.
class ZELK_API ITouchCompanionFacade {
  public:
    virtual ~ITouchCompanionFacade() = default;

    /// 2048.
    virtual int getClassID() = 0;

    /// Makes a client, with which the facade replaces the one it has, and connects it. The client
    /// is kept even when that fails.
    virtual int init(void (*callback)(int, void*, unsigned long, void*), void* context) = 0;

    /// As the operations of TouchCompanionClient with the same names.
    virtual int setRecordOutput(int output) = 0;
    virtual int startRecord() = 0;
    virtual int stopRecord() = 0;

    /// Reads the values of the keys in `params` into `params`. 0x4000000D for null. It must be an
    /// object of the factory, with class identifier 4 or 3.
    virtual int getConfigParams(ISerializableParams4* params) = 0;

    /// Not supported: always 0x4000000E.
    virtual int setConfigParams(ISerializableParams4* params) = 0;

    /// As the operations of TouchCompanionClient with the same names.
    virtual int getConfigParams(void* buffer, unsigned long* len) = 0;
    virtual int setConfigParams(const void* data, unsigned long size) = 0;
    virtual int getPacketSize() = 0;
    virtual int inspect(unsigned int* value) = 0;
    virtual int setRecordFilter(unsigned int mask) = 0;

    /// 0x4000000D for a null `command`; else as TouchCompanionClient: the text in `*result` is the
    /// caller's to free().
    virtual int sendCommand(const char* command, char** result) = 0;
};

}  // namespace pemaro
