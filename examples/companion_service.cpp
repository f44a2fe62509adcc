// SPDX-License-Identifier: Apache-2.0
// A touch companion service: it answers a command, reads out a configuration and records frames into
// the shared ring. docs/service-tutorial.md tells how it comes about.
//
//     companion_service        until it is killed; needs the Binder driver and a service manager

// Ours come first: the platform's headers use standard ones without including them.
#include "pemaro/BnTouchCompanionService.h"
#include "pemaro/RingWriter.h"
#include "pemaro/Status.h"

#include <binder/IPCThreadState.h>
#include <binder/IServiceManager.h>
#include <binder/ProcessState.h>

#include <atomic>
#include <chrono>
#include <cstring>
#include <memory>
#include <mutex>
#include <thread>

namespace {

using namespace pemaro;
using android::sp;

constexpr uint32_t kFrameBytes = 64;
constexpr uint32_t kRingFrames = 64;
constexpr int kOutputMemory = 1;
constexpr char kConfiguration[] = "gain=2";

// A recording belongs to its thread and the service. Nobody waits for the thread: what it writes once
// the service has let go goes into memory that it keeps, and a client that died in its wait, or means
// ill, can keep it in the signal of a frame for ever.
struct Recording {
    const std::unique_ptr<RingWriter> ring = RingWriter::create(kFrameBytes, kRingFrames);
    bool started = false;
    std::atomic<bool> stopped{false};

    // A hundred frames a second; one that finds no room is lost. Byte 8 holds a frame's length.
    void writeFrames() {
        uint32_t frame[kFrameBytes / sizeof(uint32_t)] = {0, 0, kFrameBytes};
        for (; !stopped; std::this_thread::sleep_for(std::chrono::milliseconds(10)), ++frame[0]) {
            ring->put(frame, sizeof(frame));
        }
    }
};

class CompanionService : public BnTouchCompanionService {
  public:
    int registerClient(const sp<ITouchCompanionClient>&) override { return STATUS_NO_ERROR; }
    int unregisterClient() override { return stopRecord(); }
    int open() override { return STATUS_NO_ERROR; }
    int close() override { return stopRecord(); }
    int getPacketSize() override { return kFrameBytes; }
    int setRecordParameter(int output) override {
        return output == kOutputMemory ? STATUS_NO_ERROR : STATUS_UNSUPPORTED;
    }
    // A new recording ends what a client that died has left running, and gets a ring of its own.
    int prepareRecord() override {
        stopRecord();
        const std::lock_guard<std::mutex> guard(mLock);
        mRecording = std::make_shared<Recording>();
        if (mRecording->ring != nullptr) return STATUS_NO_ERROR;
        mRecording = nullptr;
        return STATUS_ERROR_ALLOCATING_MEMORY;
    }
    sp<android::IMemory> getCblk() override {
        const std::lock_guard<std::mutex> guard(mLock);
        return mRecording != nullptr ? mRecording->ring->memory() : nullptr;
    }
    int startRecord() override {
        const std::lock_guard<std::mutex> guard(mLock);
        if (mRecording == nullptr || mRecording->started) return STATUS_INVALID_STATE;
        mRecording->started = true;
        std::thread([recording = mRecording] { recording->writeFrames(); }).detach();
        return STATUS_NO_ERROR;
    }
    int stopRecord() override {
        const std::lock_guard<std::mutex> guard(mLock);
        if (mRecording != nullptr) mRecording->stopped = true;
        mRecording = nullptr;
        return STATUS_NO_ERROR;
    }
    size_t getConfigParams(void* buffer, size_t size) override {
        if (size >= sizeof(kConfiguration)) memcpy(buffer, kConfiguration, sizeof(kConfiguration));
        return sizeof(kConfiguration);
    }
    int sendCommand(SerializableMap&, SerializableMap& response) override {
        return response.unserialize(R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":)"
                                    R"({"OUT_STRING":"ready","OUT_VALUE":5}}}})");
    }
    int inspect(unsigned int*) override { return STATUS_UNSUPPORTED; }
    int setRecordFile(const std::string&) override { return STATUS_UNSUPPORTED; }
    int sendEvent(int, int) override { return STATUS_UNSUPPORTED; }
    int reloadConfig(const std::string*) override { return STATUS_UNSUPPORTED; }
    int saveConfig(const std::string*) override { return STATUS_UNSUPPORTED; }
    int getConfigParams(SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int setConfigParams(const void*, size_t) override { return STATUS_UNSUPPORTED; }
    int getProperties(SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int setAFEParams(SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int getAFEParams(SerializableMap&) override { return STATUS_UNSUPPORTED; }
    int getAFEParams(SerializableMapArray&) override { return STATUS_UNSUPPORTED; }
    int saveSession(int&) override { return STATUS_UNSUPPORTED; }
    int restoreSession(int) override { return STATUS_UNSUPPORTED; }
    int setAuth(const std::string&) override { return STATUS_UNSUPPORTED; }

  private:
    std::mutex mLock;  // operations come on several of Binder's threads
    std::shared_ptr<Recording> mRecording;
};

}  // namespace

int main() {
    android::ProcessState::self()->startThreadPool();
    android::defaultServiceManager()->addService(android::String16("pemaro.TouchService"),
                                                 new CompanionService);
    android::IPCThreadState::self()->joinThreadPool();
}
