// SPDX-License-Identifier: Apache-2.0

// Several transactions, one after another, into the four simulated services.

#include <ftw.h>
#include <unistd.h>
#include <utils/String8.h>

#include <cstdint>
#include <cstdlib>
#include <string>

#include "fuzz/support/ParcelInput.h"
#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/testkit/NativeBinder.h"
#include "simulator/companion/TouchCompanionSimulator.h"
#include "simulator/managers/GestureManagerSimulator.h"
#include "simulator/managers/HandBiometricManagerSimulator.h"
#include "simulator/managers/TouchManagerSimulator.h"

namespace {

using namespace pemaro;
using android::IBinder;
using android::sp;

/// A folder for the files that the touch companion service is told to write; removed at the end.
const std::string& folder() {
    static const auto& path = *[] {
        char name[] = "/tmp/zelk-simulator-fuzzer-XXXXXX";
        fuzz::expect(mkdtemp(name) != nullptr, "no folder for files");
        atexit([] {
            nftw(
                    folder().c_str(),
                    [](const char* file, const struct stat*, int, FTW*) { return remove(file); }, 8,
                    FTW_DEPTH | FTW_PHYS);
        });
        return new std::string(name);
    }();
    return path;
}

/// The services as one input meets them. Events come so seldom that none comes.
struct Services {
    static simulator::SimulatorOptions companionOptions() {
        simulator::SimulatorOptions options;
        options.rate = 0.001;
        options.frameBytes = 256;
        options.ringFrames = 4;
        options.configPath = folder() + "/own";
        return options;
    }
    static simulator::ManagerOptions managerOptions() {
        simulator::ManagerOptions options;
        options.gestureRate = 0;
        options.handRate = 0;
        return options;
    }

    const sp<simulator::TouchCompanionSimulator> companion =
            new simulator::TouchCompanionSimulator(companionOptions());
    const sp<simulator::TouchManagerSimulator> touch =
            new simulator::TouchManagerSimulator(managerOptions());
    const sp<simulator::GestureManagerSimulator> gesture =
            new simulator::GestureManagerSimulator(managerOptions());
    const sp<simulator::HandBiometricManagerSimulator> hand =
            new simulator::HandBiometricManagerSimulator(managerOptions());

    ~Services() {
        companion->shutDown();
        touch->shutDown();
        gesture->shutDown();
        hand->shutDown();
    }

    sp<IBinder> pick(FuzzedDataProvider& input) const {
        switch (input.ConsumeIntegralInRange(0, 5)) {
            case 0:
                return touch;
            case 1:
                return gesture;
            case 2:
                return hand;
            default:
                return companion;
        }
    }

    void tick() const {
        touch->tick();
        gesture->tick();
        hand->tick();
    }
};

/// The codes whose request is a path: these get one within the folder.
bool takesPath(const IBinder& service, const Services& all, uint32_t code) {
    constexpr uint32_t kSetRecordFile = 8;
    constexpr uint32_t kReloadConfigPath = 12;
    constexpr uint32_t kSaveConfigPath = 19;
    return &service == all.companion.get() &&
           (code == kSetRecordFile || code == kReloadConfigPath || code == kSaveConfigPath);
}

void transact(const Services& all, FuzzedDataProvider& input, const fuzz::Binders& binders) {
    const sp<IBinder> service = all.pick(input);
    const auto code = input.ConsumeIntegralInRange<uint32_t>(1, 29);
    android::Parcel request;
    request.writeInterfaceToken(service->getInterfaceDescriptor());
    if (takesPath(*service, all, code)) {
        const std::string path = folder() + "/" + (input.ConsumeBool() ? "a" : "none/b");
        request.writeString8(android::String8(path.c_str()));
    } else {
        fuzz::fillParcel(request, input, binders);
    }
    if (fuzz::holdsFatalText(request)) {
        return;
    }
    request.setDataPosition(0);
    android::Parcel reply;
    service->transact(code, request, &reply);
    fuzz::touch(reply.data(), reply.dataSize());
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    pemaro::test::openDriver();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    static const auto& binders =
            *new fuzz::Binders{new BnTouchCompanionClient, new android::BBinder, nullptr};
    const Services services;
    for (int left = input.ConsumeIntegralInRange(1, 8); left > 0; --left) {
        transact(services, input, binders);
        if (input.ConsumeIntegralInRange(0, 3) == 0) {
            services.tick();
        }
    }
    return 0;
}
