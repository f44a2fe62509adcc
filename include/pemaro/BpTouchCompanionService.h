// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/ITouchCompanionService.h"

namespace pemaro {

/// Proxy of ITouchCompanionService; see there for what each operation returns. Callable from any
/// thread.
class ZELK_API BpTouchCompanionService : public android::BpInterface<ITouchCompanionService> {
  public:
    /// A proxy of the object behind `remote`, which may be of any process.
    explicit BpTouchCompanionService(const android::sp<android::IBinder>& remote);

    int registerClient(const android::sp<ITouchCompanionClient>& client) override;
    int unregisterClient() override;
    int open() override;
    android::sp<android::IMemory> getCblk() override;
    int prepareRecord() override;
    int startRecord() override;
    int stopRecord() override;
    int setRecordParameter(int output) override;
    int setRecordFile(const std::string& path) override;
    int sendEvent(int type, int param) override;
    int close() override;
    int reloadConfig(const std::string* path) override;
    int saveConfig(const std::string* path) override;
    size_t getConfigParams(void* buffer, size_t size) override;
    int getConfigParams(SerializableMap& params) override;
    int setConfigParams(const void* data, size_t size) override;
    int getProperties(SerializableMap& out) override;
    int sendCommand(SerializableMap& request, SerializableMap& response) override;
    int setAFEParams(SerializableMap& params) override;
    int getAFEParams(SerializableMap& out) override;
    int getAFEParams(SerializableMapArray& out) override;
    int getPacketSize() override;
    int inspect(unsigned int* value) override;
    int saveSession(int& sessionID) override;
    int restoreSession(int sessionID) override;
    int setAuth(const std::string& auth) override;
};

}  // namespace pemaro
