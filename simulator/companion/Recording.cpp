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
    Worker(std::shared_ptr<FrameSink> frameSink, std::unique_ptr<FrameSource> frameSource,
           std::shared_ptr<const std::atomic<uint32_t>> recordFilter,
           std::chrono::microseconds remindDelay)
            : sink(std::move(frameSink)),
              source(std::move(frameSource)),
              filter(std::move(recordFilter)),
              remindAfter(remindDelay) {}

    void run();
    void runPaced();
    void runUnpaced();
    FrameSource::Frame takeNext();
    bool put(const FrameSource::Frame& frame) { return sink->put(frame.bytes, frame.length); }
    void remindUntil(Clock::time_point next);
    bool sleepUntil(Clock::time_point when);

    const std::shared_ptr<FrameSink> sink;
    const std::unique_ptr<FrameSource> source;
    const std::shared_ptr<const std::atomic<uint32_t>> filter;
    const std::chrono::microseconds remindAfter;
    std::atomic<uint64_t> produced{0};
    std::atomic<uint64_t> dropped{0};

    std::mutex lock;
    std::condition_variable changed;
    bool stopping = false;
    bool finished = false;
};

void Recording::Worker::run() {
    if (source->isPaced()) {
        runPaced();
    } else {
        runUnpaced();
    }
    std::lock_guard<std::mutex> guard(lock);
    finished = true;
    changed.notify_all();
}

void Recording::Worker::runPaced() {
    Clock::time_point start = Clock::now();
    while (const auto due = source->due()) {
        if (Clock::now() - (start + *due) > kMaxLag) {
            start = Clock::now() - *due;
        }
        if (!sleepUntil(start + *due)) {
            return;
        }
        if (!put(takeNext())) {
            dropped += 1;
        }
        const auto next = source->due();
        remindUntil(next ? start + *next : Clock::time_point::max());
    }
}

/// Reminds the sink of its frames until all are taken or the next one is due.
void Recording::Worker::remindUntil(Clock::time_point next) {
    if (remindAfter.count() == 0) {
        return;
    }
    const Clock::time_point start = Clock::now();
    for (auto delay = remindAfter; start + delay < next; delay *= 2) {
        if (!sleepUntil(start + delay) || !sink->remind()) {
            return;
        }
    }
}

void Recording::Worker::runUnpaced() {
    while (source->due() && sleepUntil(Clock::time_point())) {
        const FrameSource::Frame frame = takeNext();
        while (!put(frame)) {
            if (!sleepUntil(Clock::now() + kRoomPoll)) {
                produced -= 1;
                return;
            }
        }
    }
}

FrameSource::Frame Recording::Worker::takeNext() {
    const auto sequence = static_cast<uint32_t>(produced.fetch_add(1));
    return source->next(sequence, monotonicTimeNs(), filter->load(std::memory_order_relaxed));
}

/// False when the recording is to end.
bool Recording::Worker::sleepUntil(Clock::time_point when) {
    std::unique_lock<std::mutex> guard(lock);
    return !changed.wait_until(guard, when, [this] { return stopping; });
}

Recording::Recording(std::shared_ptr<FrameSink> sink, std::unique_ptr<FrameSource> source,
                     std::shared_ptr<const std::atomic<uint32_t>> filter,
                     std::chrono::microseconds remindAfter)
        : mWorker(std::make_shared<Worker>(std::move(sink), std::move(source), std::move(filter),
                                           remindAfter)),
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
