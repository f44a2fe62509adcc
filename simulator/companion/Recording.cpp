// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/Recording.h"

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <utility>

#include "simulator/time/MonotonicTime.h"

namespace pemaro::simulator {
namespace {

using Clock = std::chrono::steady_clock;

constexpr auto kStopPatience = std::chrono::seconds(2);
/// How long to wait for a reader when frames are drawn as fast as it takes them.
constexpr auto kRoomPoll = std::chrono::microseconds(200);
/// A writer that fell behind by more than this starts its schedule anew instead of catching up.
constexpr auto kMaxLag = std::chrono::seconds(1);

}  // namespace

struct Recording::Worker {
    Worker(std::shared_ptr<FrameSink> frameSink, const frames::FrameGenerator& frames,
           double framesPerSec, std::shared_ptr<const std::atomic<uint32_t>> recordFilter)
            : sink(std::move(frameSink)),
              generator(frames),
              rate(framesPerSec),
              filter(std::move(recordFilter)) {}

    void run();
    void runPaced();
    void runUnpaced();
    const std::vector<uint8_t>& drawNext();
    bool put(const std::vector<uint8_t>& frame) { return sink->put(frame.data(), frame.size()); }
    bool sleepUntil(Clock::time_point when);

    const std::shared_ptr<FrameSink> sink;
    frames::FrameGenerator generator;
    const double rate;
    const std::shared_ptr<const std::atomic<uint32_t>> filter;
    std::atomic<uint64_t> produced{0};
    std::atomic<uint64_t> dropped{0};

    std::mutex lock;
    std::condition_variable changed;
    bool stopping = false;
    bool finished = false;
};

void Recording::Worker::run() {
    if (rate > 0) {
        runPaced();
    } else {
        runUnpaced();
    }
    std::lock_guard<std::mutex> guard(lock);
    finished = true;
    changed.notify_all();
}

void Recording::Worker::runPaced() {
    const auto period =
            std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(1.0 / rate));
    Clock::time_point next = Clock::now();
    while (sleepUntil(next)) {
        if (!put(drawNext())) {
            dropped += 1;
        }
        next += period;
        if (Clock::now() - next > kMaxLag) {
            next = Clock::now();
        }
    }
}

void Recording::Worker::runUnpaced() {
    while (sleepUntil(Clock::time_point())) {
        const std::vector<uint8_t>& frame = drawNext();
        while (!put(frame)) {
            if (!sleepUntil(Clock::now() + kRoomPoll)) {
                produced -= 1;
                return;
            }
        }
    }
}

const std::vector<uint8_t>& Recording::Worker::drawNext() {
    const auto sequence = static_cast<uint32_t>(produced.fetch_add(1));
    return generator.draw(sequence, monotonicTimeNs(), filter->load(std::memory_order_relaxed));
}

/// False when the recording is to end.
bool Recording::Worker::sleepUntil(Clock::time_point when) {
    std::unique_lock<std::mutex> guard(lock);
    return !changed.wait_until(guard, when, [this] { return stopping; });
}

Recording::Recording(std::shared_ptr<FrameSink> sink, const frames::FrameGenerator& generator,
                     double rate, std::shared_ptr<const std::atomic<uint32_t>> filter)
        : mWorker(std::make_shared<Worker>(std::move(sink), generator, rate, std::move(filter))),
          mThread([worker = mWorker] { worker->run(); }) {}

Recording::~Recording() {
    stop();
}

Recording::Counts Recording::stop() {
    if (mThread.joinable()) {
        std::unique_lock<std::mutex> guard(mWorker->lock);
        mWorker->stopping = true;
        mWorker->changed.notify_all();
        const bool finished = mWorker->changed.wait_for(guard, kStopPatience,
                                                        [this] { return mWorker->finished; });
        guard.unlock();
        if (finished) {
            mThread.join();
        } else {
            mThread.detach();
        }
    }
    return {mWorker->produced, mWorker->dropped};
}

}  // namespace pemaro::simulator
