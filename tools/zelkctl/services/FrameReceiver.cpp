// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/FrameReceiver.h"

#include <fmt/core.h>

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

void FrameReceiver::take(const void* frame, size_t length) {
    std::lock_guard<std::mutex> guard(mLock);
    if (mDone) {
        return;
    }
    const std::string fault = check(frame, length);
    if (!fault.empty()) {
        if (mStats.corrupt++ == 0) {
            mStats.firstCorrupt = fault;
        }
        return;
    }
    if (mFile != nullptr && !mFile->write(frame, length)) {
        mDone = true;
    } else {
        mStats.frames += 1;
        mStats.bytes += length;
        mDone = mLimit != 0 && mStats.frames == mLimit;
    }
    if (mDone) {
        mChanged.notify_all();
    }
}

/// What is wrong with a frame, or nothing. A frame of another kind has only its length to check.
std::string FrameReceiver::check(const void* frame, size_t length) {
    const uint64_t number = mStats.frames + mStats.corrupt;
    if (length < kMinFrame || length > mPacketSize) {
        return fmt::format("frame {} tells a length of {} bytes, with packets of {}", number,
                           length, mPacketSize);
    }
    frames::FrameHeader header;
    if (!frames::readFrameHeader(frame, length, &header)) {
        return "";
    }
    const char* fault = frames::frameFault(frame, length);
    if (fault != nullptr) {
        return fmt::format("frame {}: {}", number, fault);
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
