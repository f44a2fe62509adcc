// SPDX-License-Identifier: Apache-2.0
#include "bench/Calls.h"

#include <benchmark/benchmark.h>

#include <cstdint>
#include <utility>

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
                request.unserialize(data.readString8().c_str());
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

void readNothing(const Parcel&) {}

/// A call by hand: `write` adds the arguments to a request with this room, `read` takes what follows
/// the status of the reply.
template <typename Write, typename Read = decltype(&readNothing)>
Call bare(uint32_t code, size_t room, Write write, Read read = readNothing) {
    const sp<IBinder> binder = new BareBinder;
    return [=] {
        Parcel data;
        Parcel reply;
        if (room != 0) data.setDataCapacity(room);
        data.writeInterfaceToken(BareBinder::bareDescriptor());
        write(data);
        benchmark::DoNotOptimize(binder->transact(code, data, &reply, 0));
        benchmark::DoNotOptimize(reply.readInt32());
        read(reply);
    };
}

/// A call of the touch companion's proxy.
template <typename Use>
Call companion(Use use) {
    const sp<ITouchCompanionService> proxy = new BpTouchCompanionService(new IdleService);
    return [=] { benchmark::DoNotOptimize(use(*proxy)); };
}

SerializableMap commandRequest() {
    SerializableMap request;
    request.unserialize(payload("command").text);
    return request;
}

CallPair open() {
    return {"open", companion([](ITouchCompanionService& service) { return service.open(); }),
            bare(kOpen, 0, [](Parcel&) {})};
}

CallPair sendEvent() {
    return {"sendEvent",
            companion([](ITouchCompanionService& service) { return service.sendEvent(1, 2); }),
            bare(kSendEvent, 0, [](Parcel& data) {
                data.writeInt32(1);
                data.writeInt32(2);
            })};
}

CallPair inspect() {
    return {"inspect", companion([](ITouchCompanionService& service) {
                unsigned int value = 0;
                service.inspect(&value);
                return value;
            }),
            bare(
                    kInspect, 0, [](Parcel&) {},
                    [](const Parcel& reply) { benchmark::DoNotOptimize(reply.readInt32()); })};
}

CallPair setConfigParams() {
    static const std::vector<uint8_t> bytes(65536, 1);
    return {"setConfigParams64K", companion([](ITouchCompanionService& service) {
                return service.setConfigParams(bytes.data(), bytes.size());
            }),
            bare(kSetConfigBinary, 0, [](Parcel& data) {
                data.writeInt32(static_cast<int32_t>(bytes.size()));
                data.write(bytes.data(), bytes.size());
            })};
}

CallPair sendCommand() {
    static SerializableMap request = commandRequest();
    return {"sendCommand", companion([](ITouchCompanionService& service) {
                SerializableMap response;
                return service.sendCommand(request, response);
            }),
            bare(
                    kSendCommand, 0,
                    [](Parcel& data) { data.writeString8(String8(request.serialize().c_str())); },
                    [](const Parcel& reply) {
                        SerializableMap response;
                        response.unserialize(reply.readString8().c_str());
                    })};
}

CallPair gestureCallback() {
    static ITouchManagerClient::GestureData record;
    const sp<ITouchManagerClient> proxy = new BpTouchManagerClient(new IdleClient);
    return {"gestureCallback", [=] { benchmark::DoNotOptimize(proxy->gestureCallback(&record)); },
            bare(IBinder::FIRST_CALL_TRANSACTION, sizeof(record) + 128,
                 [](Parcel& data) { data.write(&record, sizeof(record)); })};
}

}  // namespace

std::vector<CallPair> calls() {
    test::openDriver();
    return {open(), sendEvent(), inspect(), setConfigParams(), sendCommand(), gestureCallback()};
}

}  // namespace pemaro::bench
