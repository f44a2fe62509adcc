// SPDX-License-Identifier: Apache-2.0

// Sends any transaction to the stub of any interface: any code, flags, fields and objects, with the interface's
// token, another one or none, with a reply parcel or without. The services behind the stubs read all they are
// given and answer with what the input says.

#include <utils/String16.h>

#include <algorithm>
#include <cstdint>
#include <cstring>

#include "fuzz/support/ParcelInput.h"
#include "pemaro/BnGestureManagerClient.h"
#include "pemaro/BnGestureManagerService.h"
#include "pemaro/BnHandBiometricManagerClient.h"
#include "pemaro/BnHandBiometricManagerService.h"
#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/BnTouchCompanionService.h"
#include "pemaro/BnTouchManagerClient.h"
#include "pemaro/BnTouchManagerService.h"
#include "pemaro/testkit/NativeBinder.h"
#include "tests/support/LocalMemory.h"

namespace {

using namespace pemaro;
using android::IBinder;
using android::sp;

/// What the services behind the stubs answer; null while no input is looked at.
FuzzedDataProvider* gInput = nullptr;

int status() {
    return gInput->ConsumeBool() ? 0 : gInput->ConsumeIntegral<int>();
}

std::string text() {
    return gInput->ConsumeRandomLengthString(64);
}

int take(const std::string& value) {
    fuzz::touch(value.data(), value.size());
    return status();
}

int take(const char* value) {
    if (value != nullptr) {
        fuzz::touch(value, strlen(value));
    }
    return status();
}

template <typename Object>
int takeObject(const sp<Object>& object) {
    if (object != nullptr && android::IInterface::asBinder(object) != nullptr) {
        android::IInterface::asBinder(object)->pingBinder();
    }
    return status();
}

template <typename Record>
int takeRecords(const Record* records, size_t count) {
    if (records != nullptr) {
        fuzz::touch(records, count * sizeof(Record));
    }
    return status();
}

class CompanionService : public BnTouchCompanionService {
  public:
    int registerClient(const sp<ITouchCompanionClient>& client) override {
        return takeObject(client);
    }
    int unregisterClient() override { return status(); }
    int open() override { return status(); }
    sp<android::IMemory> getCblk() override {
        return gInput->ConsumeBool() ? sp<android::IMemory>(new test::LocalMemory(256)) : nullptr;
    }
    int prepareRecord() override { return status(); }
    int startRecord() override { return status(); }
    int stopRecord() override { return status(); }
    int setRecordParameter(int) override { return status(); }
    int setRecordFile(const std::string& path) override { return take(path); }
    int sendEvent(int, int) override { return status(); }
    int close() override { return status(); }
    int reloadConfig(const std::string* path) override {
        return path == nullptr ? status() : take(*path);
    }
    int saveConfig(const std::string* path) override {
        return path == nullptr ? status() : take(*path);
    }
    size_t getConfigParams(void* buffer, size_t size) override {
        // A service that keeps within the buffer, and tells any length.
        const std::string bytes = text();
        if (buffer != nullptr) {
            memcpy(buffer, bytes.data(), std::min(bytes.size(), size));
        }
        return gInput->ConsumeBool() ? std::min(bytes.size(), size)
                                     : static_cast<size_t>(gInput->ConsumeIntegral<int>());
    }
    int getConfigParams(SerializableMap& params) override {
        params.add(text(), text());
        return take(params.serialize());
    }
    int setConfigParams(const void* data, size_t size) override {
        fuzz::touch(data, size);
        return status();
    }
    int getProperties(SerializableMap& out) override {
        out.add(text(), text());
        return status();
    }
    int sendCommand(SerializableMap& request, SerializableMap& response) override {
        response.add(text(), request);
        return take(request.serialize());
    }
    int setAFEParams(SerializableMap& params) override { return take(params.serialize()); }
    int getAFEParams(SerializableMap& out) override {
        out.add(text(), text());
        return status();
    }
    int getAFEParams(SerializableMapArray& out) override {
        out.add(text());
        return status();
    }
    int getPacketSize() override { return status(); }
    int inspect(unsigned int* value) override {
        *value = gInput->ConsumeIntegral<unsigned int>();
        return status();
    }
    int saveSession(int& sessionID) override {
        sessionID = gInput->ConsumeIntegral<int>();
        return status();
    }
    int restoreSession(int) override { return status(); }
    int setAuth(const std::string& auth) override { return take(auth); }
};

class TouchService : public BnTouchManagerService {
  public:
    int subscribe(const sp<ITouchManagerClient>& client) override { return takeObject(client); }
    int unsubscribe(const sp<ITouchManagerClient>& client) override { return takeObject(client); }
    int isSupported(int, bool& supported) override {
        supported = gInput->ConsumeBool();
        return status();
    }
    int isEnabled(int, bool& enabled) override {
        enabled = gInput->ConsumeBool();
        return status();
    }
    int enable(int) override { return status(); }
    int disable(int) override { return status(); }
    int configure_vm_region(android::Rect& region, bool) override {
        fuzz::touch(&region, sizeof(region));
        return status();
    }
};

class GestureService : public BnGestureManagerService {
  public:
    int subscribe(const sp<IGestureManagerClient>& client) override { return takeObject(client); }
    int unsubscribe(const sp<IGestureManagerClient>& client) override { return takeObject(client); }
    int enableWakeup() override { return status(); }
    int disableWakeup() override { return status(); }
    int startGestureDetection() override { return status(); }
    int stopGestureDetection() override { return status(); }
    int addGesture(int count, IGestureManagerClient::GestureData* samples, int& result) override {
        result = count;
        return takeRecords(samples, static_cast<size_t>(count));
    }
    int deleteGesture(int) override { return status(); }
    int enableGesture(int) override { return status(); }
    int disableGesture(int) override { return status(); }
    int improveGestureTraining(IGestureManagerClient::GestureData* sample, int& result) override {
        result = gInput->ConsumeIntegral<int>();
        return takeRecords(sample, 1);
    }
    int getMaxPreDefinedGesture(unsigned int& count) override {
        count = gInput->ConsumeIntegral<unsigned int>();
        return status();
    }
    int getMaxUserDefinedGesture(unsigned int& count) override {
        count = gInput->ConsumeIntegral<unsigned int>();
        return status();
    }
};

class HandService : public BnHandBiometricManagerService {
  public:
    int subscribe(const sp<IHandBiometricManagerClient>& client) override {
        return takeObject(client);
    }
    int unsubscribe(const sp<IHandBiometricManagerClient>& client) override {
        return takeObject(client);
    }
    int startEnrollment() override { return status(); }
    int stopEnrollment() override { return status(); }
    int scan() override { return status(); }
    int startMatching() override { return status(); }
    int stopMatching() override { return status(); }
    int cancelScan() override { return status(); }
    int setSecurity(int) override { return status(); }
    int setProfileName(const char* name) override { return take(name); }
    int deleteProfile(const char* name) override { return take(name); }
    int renameProfile(const char* first, const char* second) override {
        take(first);
        return take(second);
    }
    int getMaxUser(unsigned int& count) override {
        count = gInput->ConsumeIntegral<unsigned int>();
        return status();
    }
    int getProfileList(std::vector<std::string>& names) override {
        names.resize(gInput->ConsumeIntegralInRange<size_t>(0, 4), text());
        return status();
    }
    int enableWakeup() override { return status(); }
    int disableWakeup() override { return status(); }
};

class TouchClient : public BnTouchManagerClient {
  public:
    int gestureCallback(ITouchManagerClient::GestureData* data) override {
        return takeRecords(data, 1);
    }
};

class GestureClient : public BnGestureManagerClient {
  public:
    int gestureCallback(IGestureManagerClient::GestureData* data) override {
        return takeRecords(data, 1);
    }
};

class HandClient : public BnHandBiometricManagerClient {
  public:
    int handBiometricCallback(IHandBiometricManagerClient::HandBioData* data) override {
        return takeRecords(data, 1);
    }
};

class CompanionClient : public BnTouchCompanionClient {};

/// The stubs, and after them objects that are none and no object.
const fuzz::Binders& binders() {
    static const auto& all = *new fuzz::Binders{
            new CompanionService, new TouchService, new GestureService, new HandService,
            new CompanionClient,  new TouchClient,  new GestureClient,  new HandClient,
            new android::BBinder, nullptr};
    return all;
}
constexpr size_t kStubs = 8;

/// The platform's own transactions, ping, dump and the like, which are no business of a stub.
bool isThePlatforms(uint32_t code) {
    return code > IBinder::LAST_CALL_TRANSACTION;
}

enum class Token { kRight, kNone, kOther, kMaxValue = kOther };

void run(FuzzedDataProvider& input) {
    const sp<IBinder>& stub = binders()[input.ConsumeIntegralInRange<size_t>(0, kStubs - 1)];
    const uint32_t code = input.ConsumeBool() ? input.ConsumeIntegralInRange<uint32_t>(0, 32)
                                              : input.ConsumeIntegral<uint32_t>();
    const auto flags = input.ConsumeBool() ? input.ConsumeIntegral<uint32_t>() : 0;
    const Token token = input.ConsumeBool() ? Token::kRight : input.ConsumeEnum<Token>();
    const bool wantsReply = input.ConsumeIntegralInRange(0, 9) > 0;

    android::Parcel request;
    const android::String16& descriptor = stub->getInterfaceDescriptor();
    bool refused = false;
    if (token == Token::kRight) {
        request.writeInterfaceToken(descriptor);
    } else if (token == Token::kOther) {
        const android::String16 other(text().c_str());
        request.writeInterfaceToken(other);
        refused = other != descriptor;
    }
    fuzz::fillParcel(request, input, binders());
    refused = refused || request.dataSize() == 0;
    if (isThePlatforms(code) || fuzz::holdsFatalText(request)) {
        return;
    }
    request.setDataPosition(0);
    android::Parcel reply;
    const android::status_t result =
            stub->transact(code, request, wantsReply ? &reply : nullptr, flags);
    if (refused) {
        fuzz::expect(result == android::PERMISSION_DENIED && reply.dataSize() == 0,
                     "a request without the token was taken");
    }
    reply.setDataPosition(0);
    fuzz::touch(reply.data(), reply.dataSize());
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    pemaro::test::openDriver();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    gInput = &input;
    run(input);
    gInput = nullptr;
    return 0;
}
