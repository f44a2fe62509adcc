// SPDX-License-Identifier: Apache-2.0
// The reader's side of the ring, named frame/what/bytes of a frame. Cycle is the work of one frame without any
// waiting: put in, taken out and released by one thread. Stream is a writer and a reader on two threads, with
// the library's own waits. For comparison, indices is a bare pair of them moved by one thread, and copy is what
// moving such a frame once costs.

#include <benchmark/benchmark.h>

#include <atomic>
#include <cstdint>
#include <cstring>
#include <new>
#include <thread>
#include <vector>

#include "pemaro/TouchCompanionClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "pemaro/testkit/FakeTouchCompanionService.h"
#include "pemaro/testkit/NativeBinder.h"
#include "tests/support/LocalMemory.h"

namespace {

using android::sp;
using pemaro::TouchCompanionClient;
using pemaro::TouchCompanionSharedCblk;
using pemaro::test::FakeTouchCompanionService;
using pemaro::test::FrameRing;
using pemaro::test::ScopedServiceManager;

constexpr uint32_t kBufferFrames = 64;

// A client that records from a ring, and has no thread of its own.
class Reader {
  public:
    explicit Reader(const FrameRing& ring) {
        pemaro::test::openDriver();
        const sp<FakeTouchCompanionService> service = new FakeTouchCompanionService;
        service->cblk = ring.memory();
        ScopedServiceManager services;
        services->add("pemaro.TouchService", service);
        mClient->init();
        mClient->setRecordOutput(1);
        mClient->startRecord();
    }

    // Takes and releases up to `bytes`, and returns the frames that these were.
    uint32_t take(size_t bytes) {
        TouchCompanionClient::FrameBuffer buffer = {nullptr, bytes, 0};
        if (mClient->acquireBuffer(&buffer) != 0) {
            return 0;
        }
        benchmark::DoNotOptimize(buffer.data);
        mClient->releaseBuffer(&buffer);
        return buffer.frameCount;
    }

  private:
    const sp<TouchCompanionClient> mClient = new TouchCompanionClient;
};

// Announces a frame without writing one: the writer's cost is not what is measured.
void announce(TouchCompanionSharedCblk& block) {
    TouchCompanionSharedCblk::publishIndex(block.write, block.write + 1);
}

void Cycle(benchmark::State& state) {
    const uint32_t frameSize = static_cast<uint32_t>(state.range(0));
    FrameRing ring(kBufferFrames, frameSize);
    Reader reader(ring);
    for (auto _ : state) {
        announce(ring.cblk());
        reader.take(frameSize);
    }
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(Cycle)->Name("frame/cycle")->Arg(64)->Arg(4096)->Arg(65536);

void Stream(benchmark::State& state) {
    const uint32_t frameSize = static_cast<uint32_t>(state.range(0));
    FrameRing ring(kBufferFrames, frameSize);
    Reader reader(ring);
    std::atomic<bool> done{false};
    std::thread writer([&] {
        TouchCompanionSharedCblk& block = ring.cblk();
        std::vector<uint8_t> frame(frameSize);
        while (!done) {
            if (block.write - TouchCompanionSharedCblk::acquireIndex(block.read) < kBufferFrames) {
                memcpy(ring.slot(block.write % kBufferFrames), frame.data(), frameSize);
                announce(block);
                pthread_cond_signal(&block.cond);
            } else {
                std::this_thread::yield();
            }
        }
    });
    int64_t frames = 0;
    for (auto _ : state) {
        frames += reader.take(frameSize);
    }
    done = true;
    writer.join();
    state.SetItemsProcessed(frames);
    state.SetBytesProcessed(frames * frameSize);
}
BENCHMARK(Stream)->Name("frame/stream")->Arg(64)->Arg(4096)->Arg(65536)->UseRealTime();

void Indices(benchmark::State& state) {
    std::atomic<uint32_t> read{0};
    std::atomic<uint32_t> write{0};
    const uint8_t* frames = reinterpret_cast<const uint8_t*>(&state);
    for (auto _ : state) {
        write.store(write.load(std::memory_order_relaxed) + 1, std::memory_order_release);
        const uint32_t first = read.load(std::memory_order_relaxed);
        const uint32_t count = write.load(std::memory_order_acquire) - first;
        benchmark::DoNotOptimize(frames + first % kBufferFrames);
        read.store(first + count, std::memory_order_release);
    }
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(Indices)->Name("frame/indices");

void Copy(benchmark::State& state) {
    const size_t frameSize = static_cast<size_t>(state.range(0));
    std::vector<uint8_t> from(frameSize, 1);
    std::vector<uint8_t> to(frameSize);
    for (auto _ : state) {
        memcpy(to.data(), from.data(), frameSize);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(state.iterations() * state.range(0));
}
BENCHMARK(Copy)->Name("frame/copy")->Arg(64)->Arg(4096)->Arg(65536);

}  // namespace
