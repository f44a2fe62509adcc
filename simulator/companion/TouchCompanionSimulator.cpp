// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/TouchCompanionSimulator.h"

#include <binder/IPCThreadState.h>
#include <utils/Errors.h>

#include <algorithm>
#include <cstring>

#include "pemaro/Status.h"

using android::IBinder;
using android::sp;
using android::wp;

namespace pemaro::simulator {

/// Tells the service which handle's process died.
class TouchCompanionSimulator::DeathWatcher : public IBinder::DeathRecipient {
  public:
    explicit DeathWatcher(TouchCompanionSimulator* service) : mService(service) {}

    void binderDied(const wp<IBinder>& who) override {
        sp<TouchCompanionSimulator> service = mService.promote();
        if (service != nullptr) {
            service->forgetDead(who.unsafe_get());
        }
    }

  private:
    const wp<TouchCompanionSimulator> mService;
};

TouchCompanionSimulator::TouchCompanionSimulator(const SimulatorOptions& options)
        : mOptions(options), mDevice(options.authText), mInterpreter(mDevice, options.states) {}

/// Runs an operation under the lock, unless a fault takes its place.
template <typename Body>
int TouchCompanionSimulator::perform(const char* operation, Body body) {
    if (const auto status = mFaults.strike(operation)) {
        return *status;
    }
    std::lock_guard<std::mutex> guard(mLock);
    return body();
}

/// The same for an operation of a registered client, which is handed to `body`.
template <typename Body>
int TouchCompanionSimulator::performForClient(const char* operation, Body body) {
    return perform(operation, [&] {
        const auto found = mClients.find(android::IPCThreadState::self()->getCallingPid());
        return found == mClients.end() ? STATUS_INVALID_STATE : body(found->second);
    });
}

TouchCompanionSimulator::Totals TouchCompanionSimulator::totals() {
    std::lock_guard<std::mutex> guard(mLock);
    Totals totals = mTotals;
    totals.clients = static_cast<uint32_t>(mClients.size());
    return totals;
}

void TouchCompanionSimulator::shutDown() {
    std::lock_guard<std::mutex> guard(mLock);
    for (auto& [pid, client] : mClients) {
        endRecording(client);
    }
    mClients.clear();
}

// ---- clients ----

int TouchCompanionSimulator::registerClient(const sp<ITouchCompanionClient>& client) {
    return perform("registerClient", [&] {
        if (client == nullptr) {
            return STATUS_BAD_PARAMETER;
        }
        const sp<IBinder> handle = android::IInterface::asBinder(client);
        if (mDeathWatcher == nullptr) {
            mDeathWatcher = new DeathWatcher(this);
        }
        // A handle of this very process cannot die before us, and cannot be linked to.
        if (handle->linkToDeath(mDeathWatcher) == android::DEAD_OBJECT) {
            return STATUS_BINDER_DIED;
        }
        const pid_t pid = android::IPCThreadState::self()->getCallingPid();
        const auto entry = mClients.try_emplace(pid, pid, mOptions, mDevice.sharedFilter()).first;
        entry->second.addHandle(handle);
        narrate("client " + std::to_string(pid) + " registered");
        return STATUS_NO_ERROR;
    });
}

int TouchCompanionSimulator::unregisterClient() {
    return performForClient("unregisterClient", [this](ClientRecord& client) {
        client.takeHandle()->unlinkToDeath(mDeathWatcher);
        if (!client.hasHandles()) {
            const pid_t pid = client.pid();
            endRecording(client);
            mClients.erase(pid);
            narrate("client " + std::to_string(pid) + " unregistered");
        }
        return STATUS_NO_ERROR;
    });
}

void TouchCompanionSimulator::forgetDead(const IBinder* handle) {
    std::lock_guard<std::mutex> guard(mLock);
    for (auto entry = mClients.begin(); entry != mClients.end(); ++entry) {
        ClientRecord& client = entry->second;
        if (client.removeHandle(handle)) {
            if (!client.hasHandles()) {
                narrate("client " + std::to_string(client.pid()) + " died");
                endRecording(client);
                mClients.erase(entry);
            }
            return;
        }
    }
}

int TouchCompanionSimulator::open() {
    return performForClient("open", [](ClientRecord& client) {
        client.open();
        return STATUS_NO_ERROR;
    });
}

int TouchCompanionSimulator::close() {
    return performForClient("close", [this](ClientRecord& client) {
        endRecording(client);
        client.close();
        return STATUS_NO_ERROR;
    });
}

// ---- recording ----

int TouchCompanionSimulator::setRecordParameter(int output) {
    return performForClient("setRecordParameter",
                            [&](ClientRecord& client) { return client.setOutput(output); });
}

int TouchCompanionSimulator::setRecordFile(const std::string& path) {
    return performForClient("setRecordFile",
                            [&](ClientRecord& client) { return client.setFile(path); });
}

int TouchCompanionSimulator::prepareRecord() {
    return performForClient("prepareRecord", [](ClientRecord& client) { return client.prepare(); });
}

sp<android::IMemory> TouchCompanionSimulator::getCblk() {
    sp<android::IMemory> block;
    performForClient("getCblk", [&block](ClientRecord& client) {
        block = client.block();
        return STATUS_NO_ERROR;
    });
    return block;
}

int TouchCompanionSimulator::startRecord() {
    return performForClient("startRecord", [this](ClientRecord& client) {
        const int status = client.start();
        if (status == STATUS_NO_ERROR) {
            narrate("client " + std::to_string(client.pid()) + " records");
        }
        return status;
    });
}

int TouchCompanionSimulator::stopRecord() {
    return performForClient("stopRecord", [this](ClientRecord& client) {
        if (!client.isRecording()) {
            return STATUS_INVALID_STATE;
        }
        // A frame that a file had no room for is lost to whoever wanted the recording there.
        const bool isFile = client.recordsToFile();
        const uint64_t dropped = endRecording(client);
        return isFile && dropped > 0 ? STATUS_ERROR_WRITING_TO_FILE : STATUS_NO_ERROR;
    });
}

uint64_t TouchCompanionSimulator::endRecording(ClientRecord& client) {
    Recording::Counts counts;
    if (client.stop(&counts) != STATUS_NO_ERROR) {
        return 0;
    }
    mTotals.recordings += 1;
    mTotals.produced += counts.produced;
    mTotals.dropped += counts.dropped;
    narrate("client " + std::to_string(client.pid()) +
            " stopped: " + std::to_string(counts.produced) + " frames, " +
            std::to_string(counts.dropped) + " without room in the ring");
    return counts.dropped;
}

int TouchCompanionSimulator::getPacketSize() {
    return perform("getPacketSize", [this] { return static_cast<int>(mOptions.frameBytes); });
}

// ---- configuration ----

int TouchCompanionSimulator::configPath(const std::string* given, std::string* path) const {
    *path = given == nullptr ? mOptions.configPath : *given;
    return path->empty() ? STATUS_INVALID_FILE_PATH : STATUS_NO_ERROR;
}

int TouchCompanionSimulator::reloadConfig(const std::string* path) {
    return perform("reloadConfig", [&] {
        std::string file;
        const int status = configPath(path, &file);
        return status != STATUS_NO_ERROR ? status : mDevice.configuration().load(file);
    });
}

int TouchCompanionSimulator::saveConfig(const std::string* path) {
    return perform("saveConfig", [&] {
        std::string file;
        const int status = configPath(path, &file);
        return status != STATUS_NO_ERROR ? status : mDevice.configuration().save(file);
    });
}

size_t TouchCompanionSimulator::getConfigParams(void* buffer, size_t size) {
    size_t length = 0;
    perform("getConfigParams", [&] {
        const std::string binary = mDevice.configuration().toBinary();
        length = binary.size();
        if (buffer != nullptr && size >= length) {
            memcpy(buffer, binary.data(), length);
        }
        return STATUS_NO_ERROR;
    });
    return length;
}

int TouchCompanionSimulator::getConfigParams(SerializableMap& params) {
    return perform("getConfigParams", [&] { return mDevice.configuration().get(params); });
}

int TouchCompanionSimulator::setConfigParams(const void* data, size_t size) {
    return perform("setConfigParams",
                   [&] { return mDevice.configuration().fromBinary(data, size); });
}

int TouchCompanionSimulator::setAFEParams(SerializableMap& params) {
    return perform("setAFEParams", [&] { return mDevice.setAfe(params); });
}

int TouchCompanionSimulator::getAFEParams(SerializableMap& out) {
    return perform("getAFEParams", [&] {
        out = mDevice.afe();
        return STATUS_NO_ERROR;
    });
}

int TouchCompanionSimulator::getAFEParams(SerializableMapArray& out) {
    return perform("getAFEParams", [&] {
        out = mDevice.afeChannels();
        return STATUS_NO_ERROR;
    });
}

// ---- commands, events, sessions ----

int TouchCompanionSimulator::getProperties(SerializableMap& out) {
    return perform("getProperties", [&] {
        out = mDevice.properties();
        return STATUS_NO_ERROR;
    });
}

int TouchCompanionSimulator::sendCommand(SerializableMap& request, SerializableMap& response) {
    return perform("sendCommand", [&] { return mInterpreter.answer(request, response); });
}

int TouchCompanionSimulator::sendEvent(int type, int param) {
    return perform("sendEvent", [&] {
        mDevice.countEvent();
        narrate("event " + std::to_string(type) + " with " + std::to_string(param));
        return STATUS_NO_ERROR;
    });
}

int TouchCompanionSimulator::inspect(unsigned int* value) {
    return perform("inspect", [&] {
        const auto running = static_cast<uint32_t>(
                std::count_if(mClients.begin(), mClients.end(),
                              [](const auto& entry) { return entry.second.isRecording(); }));
        const auto clients = static_cast<uint32_t>(mClients.size());
        *value = (mDevice.events() & 0xFFFF) | std::min(clients, 255u) << 16 |
                 std::min(running, 255u) << 24;
        return STATUS_NO_ERROR;
    });
}

int TouchCompanionSimulator::saveSession(int& sessionID) {
    return perform("saveSession", [&] {
        sessionID = mDevice.saveSession();
        return STATUS_NO_ERROR;
    });
}

int TouchCompanionSimulator::restoreSession(int sessionID) {
    return perform("restoreSession", [&] { return mDevice.restoreSession(sessionID); });
}

int TouchCompanionSimulator::setAuth(const std::string& auth) {
    return perform("setAuth", [&] { return mDevice.authenticate(auth); });
}

void TouchCompanionSimulator::narrate(const std::string& line) const {
    if (mOptions.narrate) {
        mOptions.narrate(line);
    }
}

}  // namespace pemaro::simulator
