// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

namespace pemaro::test {

/// Takes the events of a manager's client: copies each record and counts the deaths of its service.
/// Its callbacks are given to the client together with its address:
///
///     RecordCollector events;
///     sp<GestureManagerClient> client = new GestureManagerClient(
///             RecordCollector::onEvent<IGestureManagerClient::GestureData>,
///             RecordCollector::onDeath, &events);
class RecordCollector {
  public:
    static constexpr std::chrono::seconds kPatience{60};

    template <typename Record>
    static void onEvent(Record* record, void* context) {
        static_cast<RecordCollector*>(context)->take(record, sizeof(Record));
    }
    static void onDeath(void* context);

    /// Each event takes this long from now on.
    void setPause(std::chrono::milliseconds pause);

    /// Waits until `count` events, or deaths, have come since the beginning;
    /// false when that takes too long.
    bool await(size_t count);
    bool awaitDeaths(int count);

    size_t count() const;
    int deaths() const;
    /// The bytes of each record.
    std::vector<std::string> records() const;

  private:
    void take(const void* record, size_t size);

    mutable std::mutex mLock;
    std::condition_variable mChanged;
    std::chrono::milliseconds mPause{0};
    std::vector<std::string> mRecords;
    int mDeaths = 0;
};

}  // namespace pemaro::test
