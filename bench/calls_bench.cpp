// SPDX-License-Identifier: Apache-2.0

// A call through proxy and stub in one process, named call/operation/zelk, and call/operation/bare: the
// same parcels written, handed to a binder and read there by hand, without a table, a check or a log.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>
#include <vector>

#include "bench/Payloads.h"
#include "pemaro/BnTouchManagerClient.h"
#include "pemaro/BpTouchCompanionService.h"
#include "pemaro/BpTouchManagerClient.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/testkit/FakeTouchCompanionService.h"
#include "pemaro/testkit/NativeBinder.h"

namespace pemaro::bench {
namespace {

using android::BBinder;
using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;
using android::String16;
using android::String8;

constexpr uint32_t kOpen = 3;
constexpr uint32_t kSendEvent = 9;
constexpr uint32_t kSetConfigBinary = 21;
constexpr uint32_t kInspect = 23;
constexpr uint32_t kSendCommand = 25;

/// A service that does nothing, not even note its calls.
class IdleService : public test::FakeTouchCompanionService {
  public:
    int open() override { return 0; }
    int sendEvent(int, int) override { return 0; }
    int setConfigParams(const void*, size_t) override { return 0; }
    int inspect(unsigned int* value) override {
        *value = 7;
        return 0;
    }
    int sendCommand(SerializableMap&, SerializableMap&) override { return 0; }
};

class IdleClient : public BnTouchManagerClient {
  public:
    int gestureCallback(GestureData* data) override {
        benchmark::DoNotOptimize(data);
        return 0;
    }
};

/// The other end of the bare calls.
class BareBinder : public BBinder {
  protected:
    status_t onTransact(uint32_t code, const Parcel& data, Parcel* reply, uint32_t) override {
        if (!data.enforceInterface(bareDescriptor())) return android::PERMISSION_DENIED;
        switch (code) {
            case kSendEvent:
                benchmark::DoNotOptimize(data.readInt32());
                benchmark::DoNotOptimize(data.readInt32());
                break;
            case kSetConfigBinary: {
                std::vector<uint8_t> bytes(static_cast<size_t>(data.readInt32()));
                data.read(bytes.data(), bytes.size());
                break;
            }
            case kInspect:
                reply->writeInt32(0);
                return reply->writeInt32(7);
            case kSendCommand: {
                SerializableMap request;
                request.unserialize(data.readString8().string());
                reply->writeInt32(0);
                return reply->writeString8(String8(SerializableMap().serialize().c_str()));
            }
            case IBinder::FIRST_CALL_TRANSACTION:
                benchmark::DoNotOptimize(
                        data.readInplace(sizeof(ITouchManagerClient::GestureData)));
                break;
            default:
                break;
        }
        return reply->writeInt32(0);
    }

  public:
    static const String16& bareDescriptor() {
        static const String16 descriptor("pemaro.TouchServiceBare");
        return descriptor;
    }
};

/// The same for a bare call: `write` adds the arguments.
template <typename Write>
void callBare(benchmark::State& state, uint32_t code, size_t room, Write write) {
    test::openDriver();
    const sp<IBinder> binder = new BareBinder;
    for (auto _ : state) {
        Parcel data;
        Parcel reply;
        if (room != 0) data.setDataCapacity(room);
        data.writeInterfaceToken(BareBinder::bareDescriptor());
        write(data);
        benchmark::DoNotOptimize(binder->transact(code, data, &reply, 0));
        benchmark::DoNotOptimize(reply.readInt32());
    }
}

template <typename Use>
void callZelk(benchmark::State& state, Use use) {
    test::openDriver();
    BpTouchCompanionService* const proxy = new BpTouchCompanionService(new IdleService);
    const sp<ITouchCompanionService> held = proxy;
    for (auto _ : state) benchmark::DoNotOptimize(use(*proxy));
}

void openZelk(benchmark::State& state) {
    callZelk(state, [](ITouchCompanionService& service) { return service.open(); });
}
BENCHMARK(openZelk)->Name("call/open/zelk");

void openBare(benchmark::State& state) {
    callBare(state, kOpen, 0, [](Parcel&) {});
}
BENCHMARK(openBare)->Name("call/open/bare");

void sendEventZelk(benchmark::State& state) {
    callZelk(state, [](ITouchCompanionService& service) { return service.sendEvent(1, 2); });
}
BENCHMARK(sendEventZelk)->Name("call/sendEvent/zelk");

void sendEventBare(benchmark::State& state) {
    callBare(state, kSendEvent, 0, [](Parcel& data) {
        data.writeInt32(1);
        data.writeInt32(2);
    });
}
BENCHMARK(sendEventBare)->Name("call/sendEvent/bare");

void inspectZelk(benchmark::State& state) {
    callZelk(state, [](ITouchCompanionService& service) {
        unsigned int value = 0;
        service.inspect(&value);
        return value;
    });
}
BENCHMARK(inspectZelk)->Name("call/inspect/zelk");

void inspectBare(benchmark::State& state) {
    callBare(state, kInspect, 0, [](Parcel&) {});
}
BENCHMARK(inspectBare)->Name("call/inspect/bare");

constexpr size_t kConfigBytes = 65536;

void setConfigZelk(benchmark::State& state) {
    const std::vector<uint8_t> bytes(kConfigBytes, 1);
    callZelk(state, [&](ITouchCompanionService& service) {
        return service.setConfigParams(bytes.data(), bytes.size());
    });
}
BENCHMARK(setConfigZelk)->Name("call/setConfigParams64K/zelk");

void setConfigBare(benchmark::State& state) {
    const std::vector<uint8_t> bytes(kConfigBytes, 1);
    callBare(state, kSetConfigBinary, 0, [&](Parcel& data) {
        data.writeInt32(static_cast<int32_t>(bytes.size()));
        data.write(bytes.data(), bytes.size());
    });
}
BENCHMARK(setConfigBare)->Name("call/setConfigParams64K/bare");

void sendCommandZelk(benchmark::State& state) {
    SerializableMap request;
    request.unserialize(payload("command").text);
    callZelk(state, [&](ITouchCompanionService& service) {
        SerializableMap response;
        return service.sendCommand(request, response);
    });
}
BENCHMARK(sendCommandZelk)->Name("call/sendCommand/zelk");

void sendCommandBare(benchmark::State& state) {
    SerializableMap request;
    request.unserialize(payload("command").text);
    callBare(state, kSendCommand, 0,
             [&](Parcel& data) { data.writeString8(String8(request.serialize().c_str())); });
}
BENCHMARK(sendCommandBare)->Name("call/sendCommand/bare");

void gestureZelk(benchmark::State& state) {
    test::openDriver();
    BpTouchManagerClient* const proxy = new BpTouchManagerClient(new IdleClient);
    const sp<ITouchManagerClient> held = proxy;
    static ITouchManagerClient::GestureData record;
    for (auto _ : state) benchmark::DoNotOptimize(proxy->gestureCallback(&record));
}
BENCHMARK(gestureZelk)->Name("call/gestureCallback/zelk");

void gestureBare(benchmark::State& state) {
    static ITouchManagerClient::GestureData record;
    callBare(state, IBinder::FIRST_CALL_TRANSACTION, sizeof(record) + 128,
             [](Parcel& data) { data.write(&record, sizeof(record)); });
}
BENCHMARK(gestureBare)->Name("call/gestureCallback/bare");

}  // namespace
}  // namespace pemaro::bench
