// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/FrameReceiver.h"

#include <fmt/core.h>
#include <sys/uio.h>
#include <unistd.h>

#include "frames/Frame.h"

namespace pemaro::zelkctl {
namespace {

/// A frame ends behind its own length at the earliest.
constexpr size_t kMinFrame = 12;

}  // namespace

std::string describeLosses(const FrameStats& stats) {
    return stats.sequenced || stats.frames == 0
                   ? fmt::format("{} lost in {} gaps", stats.lost, stats.gaps)
                   : std::string("no sequence numbers");
}

void FrameReceiver::onFrame(int, void* frame, unsigned long length, void* context) {
    static_cast<FrameReceiver*>(context)->take(frame, length);
}

FrameStats FrameReceiver::stats() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mStats;
}

bool FrameReceiver::waitUntilDone(std::chrono::milliseconds patience) {
    std::unique_lock<std::mutex> guard(mLock);
    return mChanged.wait_for(guard, patience, [this] { return mDone; });
}

bool FrameReceiver::tryStats(FrameStats& stats) const {
    const std::unique_lock<std::mutex> guard(mLock, std::try_to_lock);
    if (guard.owns_lock()) {
        stats = mStats;
    }
    return guard.owns_lock();
}

/// A file may keep the thread that brings the frames waiting, and nobody else.
const std::vector<uint8_t>* FrameReceiver::take(const void* frame, size_t length) {
    std::unique_lock<std::mutex> guard(mLock);
    if (mDone) {
        return nullptr;
    }
    std::string fault = fetch(frame, length);
    if (fault.empty()) {
        fault = check();
    }
    if (!fault.empty()) {
        if (mStats.corrupt++ == 0) {
            mStats.firstCorrupt = fault;
        }
        return nullptr;
    }
    guard.unlock();
    const bool isKept = mFile == nullptr || mFile->write(mFrame.data(), length);
    guard.lock();
    if (!isKept) {
        mDone = true;
    } else {
        mStats.frames += 1;
        mStats.bytes += length;
        mDone = mLimit != 0 && mStats.frames == mLimit;
    }
    if (mDone) {
        mChanged.notify_all();
    }
    return isKept ? &mFrame : nullptr;
}

/// Copies a frame out of the shared memory, in which it may still change; what is wrong with it, or
/// nothing.
std::string FrameReceiver::fetch(const void* frame, size_t length) {
    if (length < kMinFrame || length > mPacketSize) {
        return fmt::format("frame {} tells a length of {} bytes, with packets of {}", number(),
                           length, mPacketSize);
    }
    mFrame.resize(length);
    // The kernel stops where a plain copy would crash: the packet size is what the service says,
    // and the memory may end before.
    const iovec to{mFrame.data(), length};
    const iovec from{const_cast<void*>(frame), length};
    if (process_vm_readv(getpid(), &to, 1, &from, 1, 0) != static_cast<ssize_t>(length)) {
        return fmt::format("frame {} of {} bytes ends outside the shared memory", number(), length);
    }
    return "";
}

/// A frame of another kind has only its length to check.
std::string FrameReceiver::check() {
    frames::FrameHeader header;
    if (!frames::readFrameHeader(mFrame.data(), mFrame.size(), &header)) {
        return "";
    }
    const char* fault = frames::frameFault(mFrame.data(), mFrame.size());
    if (fault != nullptr) {
        return fmt::format("frame {}: {}", number(), fault);
    }
    follow(header.sequence);
    return "";
}

void FrameReceiver::follow(uint32_t sequence) {
    uint64_t lost = 0;
    if (mSequence.isGap(sequence, &lost)) {
        mStats.gaps += 1;
        mStats.lost += lost;
    }
    mStats.sequenced = true;
}

}  // namespace pemaro::zelkctl
