// SPDX-License-Identifier: Apache-2.0

/// broken-service: the simulated touch companion or touch manager with one fault, until it is killed.
///
///     broken-service companion|touch FAULT
///
/// Each fault is one that "zelkctl check" has to find; "none" is a good service, and "offers-nothing" one that
/// overrides nothing of what services derive from.

#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>
#include <binder/MemoryBase.h>
#include <binder/MemoryHeapBase.h>
#include <binder/ProcessState.h>
#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <cstring>
#include <new>
#include <string>
#include <thread>
#include <utility>

#include "pemaro/BasicTouchCompanionService.h"
#include "pemaro/BasicTouchManagerService.h"
#include "pemaro/BpTouchManagerClient.h"
#include "pemaro/ITouchManagerService.h"
#include "pemaro/TouchCompanionSharedCblk.h"
#include "simulator/companion/TouchCompanionSimulator.h"
#include "simulator/managers/TouchManagerSimulator.h"
#include "tools/common/BinderDriver.h"

using android::BBinder;
using android::IBinder;
using android::IMemory;
using android::MemoryBase;
using android::MemoryHeapBase;
using android::Parcel;
using android::sp;
using android::status_t;
using android::String16;

namespace pemaro::test {

namespace {

constexpr const char* kCompanion = "pemaro.TouchService";
constexpr const char* kTouch = "pemaro.TouchManagerService";

constexpr uint32_t kGetCblk = 4;
constexpr uint32_t kStartRecord = 6;
constexpr uint32_t kStopRecord = 7;
constexpr uint32_t kGetProperties = 14;
constexpr uint32_t kGetPacketSize = 20;
constexpr uint32_t kReadBinaryConfiguration = 22;
constexpr uint32_t kInspect = 23;
constexpr uint32_t kReadConfiguration = 24;
constexpr uint32_t kSubscribe = 1;
constexpr uint32_t kUnsubscribe = 2;
constexpr uint32_t kIsSupported = 3;

constexpr uint32_t kRingFrames = 8;
constexpr uint32_t kFrameBytes = 4096;

void replyWith(Parcel* reply, std::initializer_list<int32_t> numbers) {
    reply->setDataSize(0);
    reply->setDataPosition(0);
    for (const int32_t number : numbers) {
        reply->writeInt32(number);
    }
}

// Whether a request begins with the token.
bool hasToken(const Parcel& data, const char* descriptor) {
    const size_t position = data.dataPosition();
    const bool has = data.enforceInterface(String16(descriptor));
    data.setDataPosition(position);
    return has;
}

// Does what another service does, apart from its fault.
class BrokenService : public BBinder {
  public:
    BrokenService(const sp<BBinder>& good, const char* descriptor, std::string fault)
            : mFault(std::move(fault)), mGood(good), mDescriptor(descriptor) {}

    status_t onTransact(uint32_t code, const Parcel& data, Parcel* reply, uint32_t flags) override {
        const bool has = hasToken(data, mDescriptor);
        if (!has && mFault == "any-token") {
            replyWith(reply, {0});
            return android::OK;
        }
        if (!has && mFault == "code-before-token" && code > 28) {
            return android::UNKNOWN_TRANSACTION;
        }
        if (has && mFault == "any-code" && code > 28 && code < LAST_CALL_TRANSACTION) {
            return android::OK;
        }
        if (has && mFault == "no-descriptor" && code == INTERFACE_TRANSACTION) {
            reply->writeString16(String16("something.else"));
            return android::OK;
        }
        const status_t result = mGood->transact(code, data, reply, flags);
        if (!has || result < android::OK) {
            return result;
        }
        // The request once more, from behind the token.
        data.setDataPosition(0);
        data.enforceInterface(String16(mDescriptor));
        return spoil(code, data, reply) ? android::OK : result;
    }

  protected:
    // What the fault makes of a good reply; false where it leaves it alone.
    virtual bool spoil(uint32_t code, const Parcel& data, Parcel* reply) = 0;

    const std::string mFault;

  private:
    const sp<BBinder> mGood;
    const char* const mDescriptor;
};

class BrokenCompanion : public BrokenService {
  public:
    explicit BrokenCompanion(const std::string& fault)
            : BrokenService(new simulator::TouchCompanionSimulator({}), kCompanion, fault) {}

  private:
    bool spoil(uint32_t code, const Parcel& data, Parcel* reply) override {
        if (code == kInspect && mFault == "short-reply") {
            replyWith(reply, {0});
        } else if (code == kInspect && mFault == "long-reply") {
            replyWith(reply, {0, 1, 2});
        } else if (code == kInspect && mFault == "unknown-status") {
            replyWith(reply, {5, 1});
        } else if (code == kGetProperties && mFault == "unreadable-map") {
            replyWith(reply, {0});
            reply->writeString8(android::String8("{no map"));
        } else if (code == kGetPacketSize && mFault == "no-packet-size") {
            replyWith(reply, {0});
        } else if (code == kReadBinaryConfiguration && mFault == "negative-length") {
            replyWith(reply, {-1});
        } else if (code == kReadConfiguration && mFault == "dies-of-a-length" && !isWhole(data)) {
            _exit(1);
        } else if (code == kInspect && mFault == "hangs") {
            pause();
        } else if (code == kGetCblk) {
            spoilBlock(reply);
        } else if (code == kStartRecord && mBlock != nullptr) {
            std::thread([this] { writeFrames(); }).detach();
        } else if (code == kStopRecord) {
            mStopped = true;
        } else {
            return false;
        }
        return true;
    }

    // Whether the text in a request is all there.
    static bool isWhole(const Parcel& data) {
        const int32_t length = data.readInt32();
        return length >= 0 && static_cast<size_t>(length) <= data.dataAvail();
    }

    // A block of our own for faults of the ring.
    void spoilBlock(Parcel* reply) {
        const bool ownWriter = mFault == "overruns" || mFault == "no-signal" ||
                               mFault == "bad-frame-length" || mFault == "goes-on";
        if (!ownWriter && mFault != "ring-too-large" && mFault != "indices-ahead") {
            return;
        }
        const size_t size = kTouchCompanionRingOffset + kRingFrames * kFrameBytes;
        sp<MemoryHeapBase> heap = new MemoryHeapBase(size);
        auto* block = new (heap->getBase()) TouchCompanionSharedCblk();
        block->bufferFrames = mFault == "ring-too-large" ? 2 * kRingFrames : kRingFrames;
        block->frameSize = kFrameBytes;
        block->write = mFault == "indices-ahead" ? 3 : 0;
        mMemory = new MemoryBase(heap, 0, size);
        mBlock = ownWriter ? block : nullptr;
        reply->setDataSize(0);
        reply->setDataPosition(0);
        reply->writeStrongBinder(android::IInterface::asBinder(mMemory));
    }

    void writeFrames() {
        for (uint32_t write = 0; !mStopped || mFault == "goes-on";) {
            const uint32_t read = TouchCompanionSharedCblk::acquireIndex(mBlock->read);
            const bool hasRoom = write - read < kRingFrames;
            if (hasRoom || mFault == "overruns" || (mFault == "goes-on" && mStopped)) {
                const uint32_t length =
                        mFault == "bad-frame-length" ? kFrameBytes + 1 : kFrameBytes;
                memcpy(mBlock->frames() + size_t{write % kRingFrames} * kFrameBytes + 8, &length,
                       sizeof(length));
                TouchCompanionSharedCblk::publishIndex(mBlock->write, ++write);
                if (mFault != "no-signal") {
                    pthread_cond_signal(&mBlock->cond);
                }
            }
            usleep(5000);
        }
    }

    sp<IMemory> mMemory;
    TouchCompanionSharedCblk* mBlock = nullptr;
    std::atomic<bool> mStopped{false};
};

class BrokenTouchManager : public BrokenService {
  public:
    explicit BrokenTouchManager(const std::string& fault)
            : BrokenService(new simulator::TouchManagerSimulator({}), kTouch, fault) {}

  private:
    bool spoil(uint32_t code, const Parcel& data, Parcel* reply) override {
        if (code == kSubscribe) {
            mListener = data.readStrongBinder();
            mListens = true;
            std::thread([this] { report(); }).detach();
        } else if (code == kUnsubscribe && mFault != "reports-for-ever") {
            mListens = false;
        } else if (code == kIsSupported && mFault == "unsure-answer") {
            replyWith(reply, {2, 0});
        }
        if (code == kUnsubscribe && mFault == "keeps-subscriptions") {
            replyWith(reply, {0x4000000B});
        }
        return true;
    }

    void report() {
        while (mListens) {
            Parcel request;
            Parcel reply;
            request.writeInterfaceToken(String16("pemaro.TouchManagerClient"));
            if (mFault == "cuts-records-short") {
                request.writeInt32(7);
            } else {
                const std::string record(sizeof(ITouchManagerClient::GestureData), '\0');
                request.write(record.data(), record.size());
            }
            mListener->transact(1, request, &reply);
            usleep(20000);
        }
    }

    sp<IBinder> mListener;
    std::atomic<bool> mListens{false};
};

sp<BBinder> makeService(bool isTouch, const std::string& fault) {
    if (fault == "offers-nothing") {
        return isTouch ? sp<BBinder>(new pemaro::BasicTouchManagerService())
                       : sp<BBinder>(new pemaro::BasicTouchCompanionService());
    }
    return isTouch ? sp<BBinder>(new BrokenTouchManager(fault))
                   : sp<BBinder>(new BrokenCompanion(fault));
}

}  // namespace

}  // namespace pemaro::test

int main(int argc, char** argv) {
    using namespace pemaro::test;
    const std::string problem = pemaro::tools::binderProblem();
    if (!problem.empty() || argc != 3) {
        fprintf(stderr, "broken-service: %s\n", argc != 3 ? "wrong usage" : problem.c_str());
        return 1;
    }
    const bool isTouch = strcmp(argv[1], "touch") == 0;
    const sp<BBinder> service = makeService(isTouch, argv[2]);
    android::ProcessState::self()->startThreadPool();
    android::defaultServiceManager()->addService(String16(isTouch ? kTouch : kCompanion), service);
    printf("process %d\n", getpid());
    fflush(stdout);
    pause();
}
