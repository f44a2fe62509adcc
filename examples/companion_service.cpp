// SPDX-License-Identifier: Apache-2.0
// A touch companion service: it answers a command, reads out a configuration and records frames into
// the shared ring. docs/service-tutorial.md tells how it comes about.
//
//     companion_service        until it is killed; needs the Binder driver and a service manager

#include <chrono>
#include <cstdlib>
#include <cstring>
#include <thread>

#include "pemaro/BasicTouchCompanionService.h"
#include "pemaro/RingRecorder.h"
#include "pemaro/Serve.h"
#include "pemaro/Status.h"

namespace {

using namespace pemaro;

constexpr uint32_t kFrameBytes = 64;
constexpr uint32_t kRingFrames = 64;
constexpr int kOutputMemory = 1;
constexpr char kConfiguration[] = "gain=2";

// A hundred frames a second, each with its number; byte 8 holds a frame's length.
class Frames {
  public:
    void operator()(RingWriter& ring) {
        ring.put(mFrame, sizeof(mFrame));  // one that finds no room is lost
        mFrame[0] += 1;
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }

  private:
    uint32_t mFrame[kFrameBytes / sizeof(uint32_t)] = {0, 0, kFrameBytes};
};

class CompanionService : public BasicTouchCompanionService {
  public:
    int getPacketSize() override { return kFrameBytes; }
    int setRecordParameter(int output) override {
        return output == kOutputMemory ? STATUS_NO_ERROR : STATUS_UNSUPPORTED;
    }
    int prepareRecord() override { return mRecorder.prepare(kFrameBytes, kRingFrames); }
    android::sp<android::IMemory> getCblk() override { return mRecorder.memory(); }
    int startRecord() override { return mRecorder.start(Frames()); }
    int stopRecord() override { return mRecorder.stop(); }
    int close() override { return mRecorder.stop(); }
    int unregisterClient() override { return mRecorder.stop(); }

    size_t getConfigParams(void* buffer, size_t size) override {
        if (size >= sizeof(kConfiguration)) memcpy(buffer, kConfiguration, sizeof(kConfiguration));
        return sizeof(kConfiguration);
    }
    int sendCommand(SerializableMap&, SerializableMap& response) override {
        return response.unserialize(R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":)"
                                    R"({"OUT_STRING":"ready","OUT_VALUE":5}}}})");
    }

  private:
    RingRecorder mRecorder;
};

}  // namespace

int main() {
    return serve(new CompanionService) == android::OK ? EXIT_SUCCESS : EXIT_FAILURE;
}
