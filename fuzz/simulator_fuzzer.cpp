// SPDX-License-Identifier: Apache-2.0

// Several transactions, one after another, into the four simulated services.

#include <ftw.h>
#include <unistd.h>
#include <utils/String8.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <iterator>
#include <string>

#include "fuzz/support/ParcelInput.h"
#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/testkit/NativeBinder.h"
#include "simulator/companion/TouchCompanionSimulator.h"
#include "simulator/managers/GestureManagerSimulator.h"
#include "simulator/managers/HandBiometricManagerSimulator.h"
#include "simulator/managers/TouchManagerSimulator.h"
#include "tools/zelkctl/services/Interfaces.h"

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

/// The touch companion's transactions whose request is a text, and whether that is a path: these get one
/// within the folder. check-interfaces holds them against docs/binder-protocol.md.
constexpr struct {
    uint32_t code;
    bool isPath;
} kTexts[] = {
        {8, true},    // setRecordFile
        {12, true},   // reloadConfig
        {19, true},   // saveConfig
        {28, false},  // setAuth
};

bool takesPath(const IBinder& service, const Services& all, uint32_t code) {
    return &service == all.companion.get() &&
           std::any_of(std::begin(kTexts), std::end(kTexts),
                       [code](const auto& text) { return text.code == code && text.isPath; });
}

/// The first code that no service has: one bound for all, so that an input means the same codes whichever it picks.
uint32_t firstUnknownCode() {
    size_t most = 0;
    for (const zelkctl::KnownInterface* service : zelkctl::knownServices()) {
        most = std::max(most, service->operations.size());
    }
    return static_cast<uint32_t>(most) + 1;
}

void transact(const Services& all, FuzzedDataProvider& input, const fuzz::Binders& binders) {
    const sp<IBinder> service = all.pick(input);
    static const uint32_t last = firstUnknownCode();
    const auto code = input.ConsumeIntegralInRange<uint32_t>(1, last);
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
