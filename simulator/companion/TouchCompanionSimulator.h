// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>

#include <cstdint>
#include <map>
#include <mutex>
#include <string>

#include "pemaro/BnTouchCompanionService.h"
#include "simulator/companion/ClientRecord.h"
#include "simulator/companion/CommandInterpreter.h"
#include "simulator/companion/Device.h"
#include "simulator/companion/SimulatorOptions.h"
#include "simulator/faults/Fault.h"

namespace pemaro::simulator {

/// A touch companion service with a simulated device behind it.
///
/// A client is a calling process: it registers, opens, and records; each recording client has a ring
/// and a writer of its own, and a client that dies is forgotten together with its recording. What is
/// asked out of turn is answered with 0x4000000B, what makes no sense with 0x4000000D or a status
/// that tells more. Any thread may call.
///
///     android::sp<TouchCompanionSimulator> service = new TouchCompanionSimulator(options);
///     android::defaultServiceManager()->addService(android::String16("pemaro.TouchService"),
///                                                  service);
class TouchCompanionSimulator : public BnTouchCompanionService {
  public:
    struct Totals {
        uint32_t clients = 0;     ///< registered now
        uint32_t recordings = 0;  ///< ended since the start
        uint64_t produced = 0;    ///< frames of those recordings
        uint64_t dropped = 0;     ///< those of them that found no room
    };

    explicit TouchCompanionSimulator(const SimulatorOptions& options);

    /// Faults may be ordered and withdrawn at any time.
    FaultTable& faults() { return mFaults; }

    Totals totals();

    /// Ends all recordings and forgets all clients.
    void shutDown();

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
    /// Events in the low 16 bits, clients in the next 8, running recordings in the high 8.
    int inspect(unsigned int* value) override;
    int saveSession(int& sessionID) override;
    int restoreSession(int sessionID) override;
    int setAuth(const std::string& auth) override;

  private:
    class DeathWatcher;

    template <typename Body>
    int perform(const char* operation, Body body);
    template <typename Body>
    int performForClient(const char* operation, Body body);
    int configPath(const std::string* given, std::string* path) const;
    void forgetDead(const android::IBinder* handle);
    /// How many frames found no room.
    uint64_t endRecording(ClientRecord& client);
    void narrate(const std::string& line) const;

    const SimulatorOptions mOptions;
    FaultTable mFaults;

    std::mutex mLock;
    Device mDevice;
    CommandInterpreter mInterpreter;
    std::map<pid_t, ClientRecord> mClients;
    Totals mTotals;
    android::sp<DeathWatcher> mDeathWatcher;
};

}  // namespace pemaro::simulator
