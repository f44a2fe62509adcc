// SPDX-License-Identifier: Apache-2.0
#include "tests/support/RecordCollector.h"

#include <thread>

namespace pemaro::test {

void RecordCollector::onDeath(void* context) {
    auto* self = static_cast<RecordCollector*>(context);
    std::lock_guard<std::mutex> guard(self->mLock);
    self->mDeaths += 1;
    self->mChanged.notify_all();
}

void RecordCollector::setPause(std::chrono::milliseconds pause) {
    std::lock_guard<std::mutex> guard(mLock);
    mPause = pause;
}

bool RecordCollector::await(size_t count) {
    std::unique_lock<std::mutex> guard(mLock);
    return mChanged.wait_for(guard, kPatience, [&] { return mRecords.size() >= count; });
}

bool RecordCollector::awaitDeaths(int count) {
    std::unique_lock<std::mutex> guard(mLock);
    return mChanged.wait_for(guard, kPatience, [&] { return mDeaths >= count; });
}

size_t RecordCollector::count() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mRecords.size();
}

int RecordCollector::deaths() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mDeaths;
}

std::vector<std::string> RecordCollector::records() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mRecords;
}

void RecordCollector::take(const void* record, size_t size) {
    std::unique_lock<std::mutex> guard(mLock);
    mRecords.emplace_back(static_cast<const char*>(record), record == nullptr ? 0 : size);
    mChanged.notify_all();
    const std::chrono::milliseconds pause = mPause;
    guard.unlock();
    std::this_thread::sleep_for(pause);
}

}  // namespace pemaro::test
