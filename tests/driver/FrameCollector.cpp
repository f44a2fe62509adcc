// SPDX-License-Identifier: Apache-2.0
#include "tests/driver/FrameCollector.h"

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>
#include <thread>

#include "frames/Frame.h"
#include "tests/support/ChildProcess.h"

using android::sp;

namespace pemaro::test {

sp<TouchCompanionClient> FrameCollector::makeClient() {
    return new TouchCompanionClient(onFrame, this);
}

sp<TouchCompanionClient> FrameCollector::connect() {
    sp<TouchCompanionClient> client = makeClient();
    const int init = client->init();
    EXPECT_EQ(0, init);
    const int output = client->setRecordOutput(1);
    EXPECT_EQ(0, output);
    return init == 0 && output == 0 ? client : nullptr;
}

void FrameCollector::setPause(std::chrono::milliseconds pause) {
    std::lock_guard<std::mutex> guard(mLock);
    mPause = pause;
}

void FrameCollector::clear() {
    std::lock_guard<std::mutex> guard(mLock);
    mFrames = 0;
    mLost = 0;
    mNextSequence = 0;
    mFirstFault.clear();
}

bool FrameCollector::await(uint64_t count) {
    std::unique_lock<std::mutex> guard(mLock);
    return mChanged.wait_for(guard, ChildProcess::kPatience,
                             [this, count] { return mFrames >= count; });
}

uint64_t FrameCollector::frames() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mFrames;
}

uint64_t FrameCollector::lost() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mLost;
}

std::string FrameCollector::firstFault() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mFirstFault;
}

void FrameCollector::onFrame(int, void* frame, unsigned long bytes, void* context) {
    static_cast<FrameCollector*>(context)->take(frame, bytes);
}

void FrameCollector::take(const void* frame, size_t bytes) {
    std::unique_lock<std::mutex> guard(mLock);
    const char* fault = frames::frameFault(frame, bytes);
    frames::FrameHeader header{};
    if (fault == nullptr) {
        frames::readFrameHeader(frame, bytes, &header);
        mLost += header.sequence - mNextSequence;
        mNextSequence = header.sequence + 1;
    } else if (mFirstFault.empty()) {
        mFirstFault = "frame " + std::to_string(mFrames) + ": " + fault;
    }
    mFrames += 1;
    mChanged.notify_all();
    const std::chrono::milliseconds pause = mPause;
    guard.unlock();
    std::this_thread::sleep_for(pause);
}

int countFrames(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    const std::string recorded{std::istreambuf_iterator<char>(file), {}};
    int count = 0;
    for (size_t start = 0; start < recorded.size(); ++count) {
        frames::FrameHeader header{};
        if (!frames::readFrameHeader(&recorded[start], recorded.size() - start, &header) ||
            header.length > recorded.size() - start ||
            frames::frameFault(&recorded[start], header.length) != nullptr) {
            return -1;
        }
        start += header.length;
    }
    return count;
}

}  // namespace pemaro::test
