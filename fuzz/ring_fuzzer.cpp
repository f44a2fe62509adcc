// SPDX-License-Identifier: Apache-2.0

// The recording client against a block whose contents change under it: before each step of the reader that
// logs or waits, the other side writes what the input says into the control block or into a frame.

#include <fuzzer/FuzzedDataProvider.h>
#include <utils/Thread.h>

#include <algorithm>
#include <cstdint>
#include <cstring>

#include "fuzz/support/ParcelInput.h"
#include "fuzz/support/QuietLog.h"
#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "pemaro/testkit/FakeTouchCompanionService.h"
#include "pemaro/testkit/NativeBinder.h"
#include "tests/support/FakeWaits.h"
#include "tests/support/LocalMemory.h"

// The fuzzer makes the passes of the recording thread itself.
android::status_t android::Thread::run(const char*, int32_t, size_t) {
    return android::NO_ERROR;
}

namespace {

using namespace pemaro;
using android::sp;

constexpr size_t kMostFrameBytes = 1024;

/// The other side of the block.
class Writer {
  public:
    Writer(FuzzedDataProvider& input, uint8_t* block, size_t size)
            : mInput(input), mBlock(block), mSize(size) {}

    /// Values that are near to what makes sense, and any.
    void write() {
        if (mInput.remaining_bytes() == 0 || mInput.ConsumeBool()) {
            return;
        }
        // Anything but the mutex and the condition, which the faked waits do not look at.
        constexpr size_t kFirst = offsetof(TouchCompanionSharedCblk, read);
        const bool inHeader = mInput.ConsumeBool();
        const size_t last = (inHeader ? kTouchCompanionRingOffset : mSize) - sizeof(uint32_t);
        const size_t offset = mInput.ConsumeIntegralInRange<size_t>(kFirst, last);
        const uint32_t value = mInput.ConsumeBool() ? mInput.ConsumeIntegralInRange<uint32_t>(0, 40)
                                                    : mInput.ConsumeIntegral<uint32_t>();
        memcpy(mBlock + (inHeader ? offset / 4 * 4 : offset), &value, sizeof(value));
    }

  private:
    FuzzedDataProvider& mInput;
    uint8_t* const mBlock;
    const size_t mSize;
};

struct Mapping {
    const uint8_t* block;
    size_t size;
};

// What is delivered lies in the ring with its whole header, or is the ring's first byte with the length 0. The
// frame's own length is only as good as the frame.
void onFrame(int, void* frame, unsigned long length, void* context) {
    const auto& mapping = *static_cast<const Mapping*>(context);
    const uint8_t* const ring = mapping.block + kTouchCompanionRingOffset;
    const auto* const bytes = static_cast<const uint8_t*>(frame);
    if (bytes == ring && length == 0) {
        return;
    }
    constexpr size_t kHeader = 12;
    fuzz::expect(bytes >= ring && bytes <= mapping.block + mapping.size &&
                         static_cast<size_t>(mapping.block + mapping.size - bytes) >= kHeader,
                 "a frame outside the ring was delivered");
    const auto left = static_cast<size_t>(mapping.block + mapping.size - bytes);
    fuzz::touch(bytes, std::min<size_t>(length, left));
}

void run(FuzzedDataProvider& input) {
    static auto& services = *new test::ScopedServiceManager;
    static const auto& service =
            *new sp<test::FakeTouchCompanionService>(new test::FakeTouchCompanionService);
    services->add("pemaro.TouchService", service);

    // A block that may be too small, with a geometry that need not fit it.
    const size_t size =
            input.ConsumeIntegralInRange<size_t>(1, kTouchCompanionRingOffset + kMostFrameBytes);
    const sp<test::LocalMemory> memory = new test::LocalMemory(size);
    service->cblk = memory;
    Mapping mapping = {memory->bytes(), size};
    test::FakeWaits waits;
    const sp<TouchCompanionClient> client = new TouchCompanionClient(onFrame, &mapping);
    fuzz::expect(client->init() == 0, "init");
    fuzz::expect(client->setRecordOutput(1) == 0, "setRecordOutput");
    const int status = client->startRecord();
    const bool fits = size >= kTouchCompanionRingOffset;
    fuzz::expect((status == 0) == fits, "a block of this size");
    service->cblk = nullptr;
    if (!fits) {
        service->clearCalls();
        return;
    }
    Writer writer(input, memory->bytes(), size);
    auto* block = reinterpret_cast<TouchCompanionSharedCblk*>(memory->bytes());
    block->bufferFrames = input.ConsumeIntegralInRange<uint32_t>(0, 9);
    block->frameSize = input.ConsumeIntegralInRange<uint32_t>(0, 128);
    fuzz::onLogLine([&] { writer.write(); });
    waits.onWait([&](int) { writer.write(); });
    for (int passes = input.ConsumeIntegralInRange(1, 6); passes > 0; --passes) {
        if (input.ConsumeBool()) {
            client->processData();
        } else {
            TouchCompanionClient::FrameBuffer buffer = {nullptr, input.ConsumeIntegral<uint16_t>(),
                                                        0};
            if (client->acquireBuffer(&buffer) == STATUS_NO_ERROR) {
                client->releaseBuffer(&buffer);
            }
        }
    }
    fuzz::onLogLine(nullptr);
    client->stopRecord();
    service->clearCalls();
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    pemaro::test::openDriver();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    run(input);
    return 0;
}
