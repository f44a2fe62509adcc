// SPDX-License-Identifier: Apache-2.0
// Uses the touch companion through the exported factory, as a program does that was built without the
// library: it loads libzelkclient.so by name and includes nothing but the interfaces' headers.
//
//     facade_by_name [LIBRARY]        LIBRARY is libzelkclient.so, found as dlopen() finds it
//
// It reads configuration parameters, sends a command and records frames for a second. The exit status
// is 0, or 1 with one line on stderr when something fails. It needs the Binder driver, a service
// manager and a touch companion service, such as zelk-touchstack.

#include <dlfcn.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <thread>

#include "pemaro/ISerializableParams4.h"
#include "pemaro/ITouchCompanionFacade.h"

namespace {

using pemaro::ISerializableParams4;
using pemaro::ITouchCompanionFacade;

using Factory = int (*)(int classID, int version, void** instance);

constexpr int kOutputMemory = 1;

int fail(const char* what) {
    fprintf(stderr, "facade_by_name: %s\n", what);
    return EXIT_FAILURE;
}

int fail(const char* operation, int status) {
    fprintf(stderr, "facade_by_name: %s failed with status 0x%x\n", operation,
            static_cast<unsigned int>(status));
    return EXIT_FAILURE;
}

// An object of the factory is the caller's, who deletes it through its virtual destructor.
template <typename Interface>
std::unique_ptr<Interface> make(Factory factory, int classID) {
    void* instance = nullptr;
    factory(classID, classID << 16, &instance);
    return std::unique_ptr<Interface>(static_cast<Interface*>(instance));
}

struct Recording {
    std::atomic<unsigned long> frames{0};
    std::atomic<unsigned long> bytes{0};
};

// Runs on a thread of the library's own; the frame is valid until this returns.
void onFrame(int /* zero */, void* /* frame */, unsigned long bytes, void* context) {
    Recording& recording = *static_cast<Recording*>(context);
    recording.frames += 1;
    recording.bytes += bytes;
}

// The object names the wanted keys, and receives their values.
int readParameters(ITouchCompanionFacade& facade, ISerializableParams4& params) {
    for (const char* name : {"gain", "report.rate"}) {
        std::string key = name;
        std::string value;
        params.setValue(key, value);
    }
    const int status = facade.getConfigParams(&params);
    if (status != 0) {
        return fail("reading the configuration", status);
    }
    for (int i = 0; i < params.size(); ++i) {
        std::string key;
        std::string value;
        params.getKeyAt(i, key);
        params.getValueAt(i, value);
        printf("%s is %s\n", key.c_str(), value.c_str());
    }
    return EXIT_SUCCESS;
}

int sendCommand(ITouchCompanionFacade& facade, const char* command) {
    char* answer = nullptr;
    const int status = facade.sendCommand(command, &answer);
    const std::unique_ptr<char, decltype(&free)> owned(answer, &free);
    if (status != 0) {
        return fail(command, status);
    }
    printf("%s: %s\n", command, answer);
    return EXIT_SUCCESS;
}

int record(ITouchCompanionFacade& facade, const Recording& recording) {
    int status = facade.setRecordOutput(kOutputMemory);
    if (status != 0) {
        return fail("choosing the output", status);
    }
    status = facade.startRecord();
    if (status != 0) {
        return fail("starting the recording", status);
    }
    std::this_thread::sleep_for(std::chrono::seconds(1));
    status = facade.stopRecord();
    if (status != 0) {
        return fail("stopping the recording", status);
    }
    printf("recorded %lu frames, %lu bytes\n", recording.frames.load(), recording.bytes.load());
    return recording.frames > 0 ? EXIT_SUCCESS : fail("no frame came");
}

int run(Factory factory) {
    Recording recording;
    const auto facade = make<ITouchCompanionFacade>(factory, 2048);
    const auto params = make<ISerializableParams4>(factory, 4);
    if (facade == nullptr || params == nullptr) {
        return fail("the library makes no such objects");
    }
    const int status = facade->init(onFrame, &recording);
    if (status != 0) {
        return fail("connecting to the touch companion service", status);
    }
    int result = readParameters(*facade, *params);
    if (result == EXIT_SUCCESS) {
        result = sendCommand(*facade, "calibrate 3 0x10");
    }
    if (result == EXIT_SUCCESS) {
        result = record(*facade, recording);
    }
    return result;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc > 2) {
        fprintf(stderr, "usage: facade_by_name [LIBRARY]\n");
        return 2;
    }
    // The platform ends a process that finds no driver; this one rather says so.
    if (access("/dev/binder", R_OK | W_OK) != 0) {
        return fail("there is no Binder driver: /dev/binder cannot be opened");
    }
    // Never closed: the platform keeps threads and objects of the library until the process ends.
    void* const library = dlopen(argc == 2 ? argv[1] : "libzelkclient.so", RTLD_NOW);
    if (library == nullptr) {
        return fail(dlerror());
    }
    const auto factory = reinterpret_cast<Factory>(dlsym(library, "VEXPemaroCreateInstance"));
    if (factory == nullptr) {
        return fail(dlerror());
    }
    return run(factory);
}
