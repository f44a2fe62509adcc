// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/BnTouchCompanionService.h"
#include "pemaro/Status.h"

namespace pemaro {

/// A touch companion service that offers nothing, to derive one from that overrides what it offers.
///
/// The operations that only tell something, registerClient(), unregisterClient(), open() and
/// close(), succeed, so that a client can connect. All others answer 0x4000000E (unsupported), which
/// reaches the client's caller, but for prepareRecord()'s, which the proxy ignores: getCblk() returns
/// null, and that is what the client's startRecord() answers 0x4000000A for. getConfigParams() of the
/// binary configuration returns 0, its failure. Who overrides one of two overloads names the other by
/// `using`, if it is to be called by the class's own name.
///
/// The class is all in this header.
class BasicTouchCompanionService : public BnTouchCompanionService {
  public:
    int registerClient(const android::sp<ITouchCompanionClient>&) override {
        return STATUS_NO_ERROR;
    }
    int unregisterClient() override { return STATUS_NO_ERROR; }
    int open() override { return STATUS_NO_ERROR; }
    int close() override { return STATUS_NO_ERROR; }
    android::sp<android::IMemory> getCblk() override { return nullptr; }
    int prepareRecord() override { return STATUS_UNSUPPORTED; }
    int startRecord() override { return STATUS_UNSUPPORTED; }
    int stopRecord() override { return STATUS_UNSUPPORTED; }
    int setRecordParameter(int) override { return STATUS_UNSUPPORTED; }
    int setRecordFile(const std::string&) override { return STATUS_UNSUPPORTED; }
    int sendEvent(int, int) override { return STATUS_UNSUPPORTED; }
    int reloadConfig(const std::string*) override { return STATUS_UNSUPPORTED; }
    int saveConfig(const std::string*) override { return STATUS_UNSUPPORTED; }
    size_t getConfigParams(void*, size_t) override { return 0; }
    int getConfigParams(SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int setConfigParams(const void*, size_t) override { return STATUS_UNSUPPORTED; }
    int getProperties(SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int sendCommand(SerializableMap&, SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int setAFEParams(SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int getAFEParams(SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int getAFEParams(SerializableMapArray&) override { return STATUS_UNSUPPORTED; }
    int getPacketSize() override { return STATUS_UNSUPPORTED; }
    int inspect(unsigned int*) override { return STATUS_UNSUPPORTED; }
    int saveSession(int&) override { return STATUS_UNSUPPORTED; }
    int restoreSession(int) override { return STATUS_UNSUPPORTED; }
    int setAuth(const std::string&) override { return STATUS_UNSUPPORTED; }
};

}  // namespace pemaro
