// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <mutex>
#include <string>
#include <vector>

#include "pemaro/BnTouchCompanionService.h"

namespace pemaro::test {

/// A touch companion service that notes each call with its arguments and answers as prepared.
///
///     sp<FakeTouchCompanionService> service = new FakeTouchCompanionService;
///     service->setStatus("open", STATUS_INVALID_STATE);
///     services->add("pemaro.TouchService", service);
///     EXPECT_EQ(STATUS_INVALID_STATE, client->init());
///     EXPECT_EQ((Calls{"registerClient", "open"}), service->calls());
///
/// A call is noted as its name, with its arguments in parentheses where it has any that travel:
/// `setRecordParameter(1)`, `setRecordFile(/f)`, `reloadConfig(null)`, `sendCommand({"a":1})`. The
/// overloads are told apart as `getConfigParams(binary)` against `getConfigParams({...})`, and as
/// `getAFEParams(map)` against `getAFEParams(array)`.
class FakeTouchCompanionService : public BnTouchCompanionService {
  public:
    /// Notes of calls, in their order.
    using Calls = std::vector<std::string>;

    /// The status of an operation, by its bare name; 0 until set.
    void setStatus(const std::string& operation, int status);

    /// Runs at each call, after it was noted and before it is answered, with the call's note.
    void onCall(std::function<void(const std::string& call)> hook);

    /// The notes since the start or the last clearCalls().
    Calls calls() const;
    void clearCalls();

    // What the operations answer; to be set before they are called.
    android::sp<android::IMemory> cblk;  ///< getCblk()
    SerializableMap params;              ///< getConfigParams(map): merged into the caller's map
    SerializableMap properties;          ///< getProperties()
    SerializableMap response;            ///< sendCommand()
    SerializableMap afeParams;           ///< getAFEParams(map)
    SerializableMapArray afeArray;       ///< getAFEParams(array)
    std::vector<uint8_t> config;         ///< getConfigParams(binary); see `configLength`
    int configLength = -1;               ///< its result, where it is not the size of `config`
    int packetSize = 0;                  ///< getPacketSize()
    unsigned int inspection = 0;         ///< inspect()
    int sessionID = 0;                   ///< saveSession()

    // What the operations were given last.
    android::sp<ITouchCompanionClient> client;  ///< registerClient()
    std::vector<uint8_t> receivedConfig;        ///< setConfigParams()

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

  private:
    int called(const std::string& operation);
    int called(const std::string& operation, const std::string& arguments);
    int note(const std::string& operation, const std::string& call);

    mutable std::mutex mLock;
    Calls mCalls;
    std::map<std::string, int> mStatuses;
    std::function<void(const std::string& call)> mHook;
};

}  // namespace pemaro::test
