// SPDX-License-Identifier: Apache-2.0
// Uses the touch companion through TouchCompanionClient, as a program does that links the library.
//
//     client_linked
//
// It asks about the device, reads the binary configuration, sends a command and records frames for a
// second. The exit status is 0, or 1 with one line on stderr when something fails. It needs the Binder
// driver, a service manager and a touch companion service, such as zelk-touchstack.

#include <unistd.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <thread>
#include <vector>

#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"

namespace {

using pemaro::TouchCompanionClient;

constexpr int kOutputMemory = 1;
constexpr size_t kMostConfiguration = 1 << 20;  // more fits in no answer

int fail(const char* what, const char* why) {
    fprintf(stderr, "client_linked: %s: %s\n", what, why);
    return EXIT_FAILURE;
}

int fail(const char* operation, int status) {
    return fail(operation, pemaro::errStr(status));
}

struct Recording {
    std::atomic<unsigned long> frames{0};
    std::atomic<unsigned long> bytes{0};
};

// Runs on a thread of the client's own; the frame is valid until this returns.
void onFrame(int /* zero */, void* /* frame */, unsigned long bytes, void* context) {
    Recording& recording = *static_cast<Recording*>(context);
    recording.frames += 1;
    recording.bytes += bytes;
}

// A length of 0 asks for the length, which is the service's word; then the bytes are read into as
// many.
int readConfiguration(TouchCompanionClient& client) {
    size_t length = 0;
    int status = client.getConfigParams(nullptr, &length);
    if (status != pemaro::STATUS_NO_ERROR) {
        return fail("asking for the configuration's length", status);
    }
    if (length > kMostConfiguration) {
        return fail("asking for the configuration's length", "the answer cannot be");
    }
    std::vector<char> configuration(length);
    status = client.getConfigParams(configuration.data(), &length);
    if (status != pemaro::STATUS_NO_ERROR) {
        return fail("reading the configuration", status);
    }
    printf("packet size %d, configuration of %zu bytes\n", client.getPacketSize(), length);
    return EXIT_SUCCESS;
}

// The text of the answer is the caller's to free.
int sendCommand(TouchCompanionClient& client, const char* command) {
    char* answer = nullptr;
    const int status = client.sendCommand(command, &answer);
    const std::unique_ptr<char, decltype(&free)> owned(answer, &free);
    if (status != pemaro::STATUS_NO_ERROR) {
        return fail(command, status);
    }
    printf("%s: %s\n", command, answer);
    return EXIT_SUCCESS;
}

int record(TouchCompanionClient& client, const Recording& recording) {
    int status = client.setRecordOutput(kOutputMemory);
    if (status == pemaro::STATUS_NO_ERROR) {
        status = client.startRecord();
    }
    if (status != pemaro::STATUS_NO_ERROR) {
        return fail("starting the recording", status);
    }
    std::this_thread::sleep_for(std::chrono::seconds(1));
    status = client.stopRecord();
    if (status != pemaro::STATUS_NO_ERROR) {
        return fail("stopping the recording", status);
    }
    printf("recorded %lu frames, %lu bytes\n", recording.frames.load(), recording.bytes.load());
    return recording.frames > 0 ? EXIT_SUCCESS : fail("recording", "no frame came");
}

int run() {
    Recording recording;
    const android::sp<TouchCompanionClient> client = new TouchCompanionClient(onFrame, &recording);
    const int status = client->init();
    if (status != pemaro::STATUS_NO_ERROR) {
        return fail("connecting to the touch companion service", status);
    }
    int result = readConfiguration(*client);
    if (result == EXIT_SUCCESS) {
        result = sendCommand(*client, "status");
    }
    if (result == EXIT_SUCCESS) {
        result = record(*client, recording);
    }
    return result;
}

}  // namespace

int main(int argc, char** /* argv */) {
    if (argc > 1) {
        fprintf(stderr, "usage: client_linked\n");
        return 2;
    }
    // The platform ends a process that finds no driver; this one rather says so.
    if (access("/dev/binder", R_OK | W_OK) != 0) {
        return fail("/dev/binder cannot be opened", "there is no Binder driver");
    }
    return run();
}
