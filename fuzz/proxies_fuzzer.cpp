// SPDX-License-Identifier: Apache-2.0

// Calls any operation of any proxy and answers it with any reply, or with any failure of the transaction.

#include <ui/Rect.h>
#include <utils/String16.h>

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "fuzz/support/ParcelInput.h"
#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/BpGestureManagerClient.h"
#include "pemaro/BpGestureManagerService.h"
#include "pemaro/BpHandBiometricManagerClient.h"
#include "pemaro/BpHandBiometricManagerService.h"
#include "pemaro/BpTouchCompanionClient.h"
#include "pemaro/BpTouchCompanionService.h"
#include "pemaro/BpTouchManagerClient.h"
#include "pemaro/BpTouchManagerService.h"
#include "pemaro/Status.h"
#include "pemaro/testkit/NativeBinder.h"
#include "tests/support/LocalMemory.h"

namespace {

using namespace pemaro;
using android::IBinder;
using android::Parcel;
using android::sp;

/// The other process: answers each transaction as the input says.
class Remote : public android::BBinder {
  public:
    FuzzedDataProvider* input = nullptr;
    const fuzz::Binders* binders = nullptr;
    android::status_t result = 0;

  protected:
    android::status_t onTransact(uint32_t, const Parcel& request, Parcel* reply,
                                 uint32_t) override {
        fuzz::touch(request.data(), request.dataSize());
        // Only negative results reach a caller in another process.
        result = input->ConsumeIntegralInRange(0, 7) == 0 ? input->ConsumeIntegralInRange(-200, -1)
                                                          : 0;
        if (reply == nullptr) {
            return result;
        }
        if (input->ConsumeBool()) {
            reply->writeInt32(0);
        }
        fuzz::fillParcel(*reply, *input, *binders);
        if (fuzz::holdsFatalText(*reply)) {
            reply->setDataSize(0);
        }
        reply->setDataPosition(0);
        return result;
    }
};

const sp<Remote>& remote() {
    static const sp<Remote>& instance = *new sp<Remote>(new Remote);
    return instance;
}

const fuzz::Binders& binders() {
    static const auto& all =
            *new fuzz::Binders{android::IInterface::asBinder(new test::LocalMemory(256)),
                               new android::BBinder, nullptr};
    return all;
}

constexpr int kUntouched = 0x5a5a5a5a;

/// An out-parameter is left alone when the transaction fails.
template <typename Value>
void expectUntouched(const Value& value, const Value& before) {
    fuzz::expect(remote()->result == 0 || value == before,
                 "an out-parameter was set although the transaction failed");
}

int expectStatus(int status) {
    fuzz::expect(remote()->result == 0 || status == STATUS_UNKNOWN_ERROR,
                 "a failed transaction has another status");
    return status;
}

using Operation = std::function<void(FuzzedDataProvider&)>;

SerializableMap map() {
    SerializableMap values;
    values.add("before", kUntouched);
    return values;
}

std::vector<Operation> companionOperations() {
    static const auto& service =
            *new sp<ITouchCompanionService>(new BpTouchCompanionService(remote()));
    const auto intoMap = [](int (ITouchCompanionService::*operation)(SerializableMap&)) {
        SerializableMap values = map();
        const std::string before = values.serialize();
        const int status = expectStatus((service.get()->*operation)(values));
        if (status != 0) {
            fuzz::expect(values.serialize() == before, "a failed call changed the map");
        }
    };
    return {
            [](auto&) { expectStatus(service->registerClient(new BnTouchCompanionClient)); },
            [](auto&) { expectStatus(service->unregisterClient()); },
            [](auto&) { expectStatus(service->open()); },
            [](auto&) {
                const auto memory = service->getCblk();
                fuzz::expect(remote()->result == 0 || memory == nullptr, "a block from nowhere");
                if (memory != nullptr) {
                    ssize_t offset = 0;
                    size_t size = 0;
                    memory->getMemory(&offset, &size);
                }
            },
            [](auto&) { expectStatus(service->prepareRecord()); },
            [](auto&) { expectStatus(service->startRecord()); },
            [](auto&) { expectStatus(service->stopRecord()); },
            [](auto& input) {
                expectStatus(service->setRecordParameter(input.template ConsumeIntegral<int>()));
            },
            [](auto& input) {
                expectStatus(service->setRecordFile(input.ConsumeRandomLengthString(64)));
            },
            [](auto&) { expectStatus(service->sendEvent(1, 2)); },
            [](auto&) { expectStatus(service->close()); },
            [](auto&) { expectStatus(service->reloadConfig(nullptr)); },
            [](auto& input) {
                const std::string path = input.ConsumeRandomLengthString(64);
                expectStatus(service->saveConfig(&path));
            },
            [](auto& input) {
                const size_t size = input.template ConsumeIntegralInRange<size_t>(0, 256);
                std::unique_ptr<uint8_t[]> buffer(new uint8_t[size]);
                const size_t length = service->getConfigParams(buffer.get(), size);
                fuzz::expect(remote()->result == 0 || length == 0, "a length from nowhere");
            },
            [=](auto&) { intoMap(&ITouchCompanionService::getConfigParams); },
            [](auto& input) {
                const std::string bytes = input.ConsumeRandomLengthString(64);
                expectStatus(service->setConfigParams(bytes.data(), bytes.size()));
            },
            [=](auto&) { intoMap(&ITouchCompanionService::getProperties); },
            [](auto&) {
                SerializableMap request = map();
                SerializableMap response = map();
                const int status = expectStatus(service->sendCommand(request, response));
                fuzz::expect(request.serialize() == map().serialize(), "the request was changed");
                fuzz::expect(status == 0 || response.serialize() == map().serialize(),
                             "a failed call changed the response");
            },
            [=](auto&) { intoMap(&ITouchCompanionService::setAFEParams); },
            [=](auto&) { intoMap(&ITouchCompanionService::getAFEParams); },
            [](auto&) {
                SerializableMapArray array;
                expectStatus(service->getAFEParams(array));
                array.serialize();
            },
            [](auto&) { expectStatus(service->getPacketSize()); },
            [](auto&) {
                unsigned int value = kUntouched;
                expectStatus(service->inspect(&value));
                expectUntouched<unsigned int>(value, kUntouched);
            },
            [](auto&) {
                int session = kUntouched;
                expectStatus(service->saveSession(session));
                expectUntouched(session, kUntouched);
            },
            [](auto&) { expectStatus(service->restoreSession(3)); },
            [](auto& input) {
                expectStatus(service->setAuth(input.ConsumeRandomLengthString(64)));
            },
            [](auto&) {
                static const auto& client =
                        *new sp<ITouchCompanionClient>(new BpTouchCompanionClient(remote()));
                android::IInterface::asBinder(client)->pingBinder();
            },
    };
}

std::vector<Operation> touchOperations() {
    static const auto& service = *new sp<ITouchManagerService>(new BpTouchManagerService(remote()));
    static const auto& client = *new sp<ITouchManagerClient>(new BpTouchManagerClient(remote()));
    static auto& record = *new ITouchManagerClient::GestureData{};
    return {
            [](auto&) { expectStatus(service->subscribe(client)); },
            [](auto&) { expectStatus(service->unsubscribe(nullptr)); },
            [](auto&) {
                bool supported = true;
                expectStatus(service->isSupported(1, supported));
                expectUntouched(supported, true);
            },
            [](auto&) {
                bool enabled = false;
                expectStatus(service->isEnabled(1, enabled));
                expectUntouched(enabled, false);
            },
            [](auto&) { expectStatus(service->enable(1)); },
            [](auto&) { expectStatus(service->disable(1)); },
            [](auto&) {
                android::Rect region(1, 2, 3, 4);
                expectStatus(service->configure_vm_region(region, true));
            },
            [](auto&) { client->gestureCallback(&record); },
            [](auto&) { client->gestureCallback(nullptr); },
    };
}

std::vector<Operation> gestureOperations() {
    static const auto& service =
            *new sp<IGestureManagerService>(new BpGestureManagerService(remote()));
    static const auto& client =
            *new sp<IGestureManagerClient>(new BpGestureManagerClient(remote()));
    static auto& records = *new std::vector<IGestureManagerClient::GestureData>(2);
    return {
            [](auto&) { expectStatus(service->subscribe(client)); },
            [](auto&) { expectStatus(service->unsubscribe(client)); },
            [](auto&) { expectStatus(service->enableWakeup()); },
            [](auto&) { expectStatus(service->disableWakeup()); },
            [](auto&) { expectStatus(service->startGestureDetection()); },
            [](auto&) { expectStatus(service->stopGestureDetection()); },
            [](auto& input) {
                int result = kUntouched;
                const int count = input.ConsumeBool() ? 2 : -1;
                expectStatus(service->addGesture(count, records.data(), result));
                expectUntouched(result, kUntouched);
            },
            [](auto&) { expectStatus(service->deleteGesture(9)); },
            [](auto&) { expectStatus(service->enableGesture(9)); },
            [](auto&) { expectStatus(service->disableGesture(9)); },
            [](auto&) {
                int result = kUntouched;
                expectStatus(service->improveGestureTraining(records.data(), result));
                expectUntouched(result, kUntouched);
            },
            [](auto&) {
                unsigned int count = kUntouched;
                expectStatus(service->getMaxPreDefinedGesture(count));
                expectUntouched<unsigned int>(count, kUntouched);
            },
            [](auto&) {
                unsigned int count = kUntouched;
                expectStatus(service->getMaxUserDefinedGesture(count));
                expectUntouched<unsigned int>(count, kUntouched);
            },
            [](auto&) { client->gestureCallback(records.data()); },
    };
}

std::vector<Operation> handOperations() {
    static const auto& service =
            *new sp<IHandBiometricManagerService>(new BpHandBiometricManagerService(remote()));
    static const auto& client =
            *new sp<IHandBiometricManagerClient>(new BpHandBiometricManagerClient(remote()));
    static auto& record = *new IHandBiometricManagerClient::HandBioData{};
    return {
            [](auto&) { expectStatus(service->subscribe(client)); },
            [](auto&) { expectStatus(service->unsubscribe(client)); },
            [](auto&) { expectStatus(service->startEnrollment()); },
            [](auto&) { expectStatus(service->stopEnrollment()); },
            [](auto&) { expectStatus(service->scan()); },
            [](auto&) { expectStatus(service->startMatching()); },
            [](auto&) { expectStatus(service->stopMatching()); },
            [](auto&) { expectStatus(service->cancelScan()); },
            [](auto&) { expectStatus(service->setSecurity(1)); },
            [](auto&) { expectStatus(service->setProfileName("a")); },
            [](auto&) { expectStatus(service->deleteProfile("a")); },
            [](auto&) { expectStatus(service->renameProfile("a", "b")); },
            [](auto&) {
                unsigned int count = kUntouched;
                expectStatus(service->getMaxUser(count));
                expectUntouched<unsigned int>(count, kUntouched);
            },
            [](auto&) {
                std::vector<std::string> names = {"before"};
                expectStatus(service->getProfileList(names));
                fuzz::expect(names[0] == "before", "a name was lost");
                expectUntouched<size_t>(names.size(), 1);
            },
            [](auto&) { expectStatus(service->enableWakeup()); },
            [](auto&) { expectStatus(service->disableWakeup()); },
            [](auto&) { client->handBiometricCallback(&record); },
    };
}

const std::vector<Operation>& operations() {
    static const auto& all = *[] {
        auto* list = new std::vector<Operation>;
        for (const auto& some :
             {companionOperations(), touchOperations(), gestureOperations(), handOperations()}) {
            list->insert(list->end(), some.begin(), some.end());
        }
        return list;
    }();
    return all;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    pemaro::test::openDriver();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    remote()->input = &input;
    remote()->binders = &binders();
    remote()->result = 0;
    operations()[input.ConsumeIntegralInRange<size_t>(0, operations().size() - 1)](input);
    return 0;
}
