// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "frames/FrameFile.h"
#include "tools/common/LiveLine.h"
#include "tools/zelkctl/services/EventRecord.h"
#include "tools/zelkctl/terminal/Output.h"

namespace pemaro::zelkctl {

/// What is waited for: a good end, or one of those that are not.
struct EventGoal {
    std::optional<simulator::HandEvent> reached;  ///< nothing is waited for without it
    std::vector<simulator::HandEvent> missed;

    bool isEndedBy(simulator::HandEvent event) const;
};

/// Prints the events of a manager, one a line, and keeps their records. A line tells when an event came
/// and what it was (see EventRecord), or of a record of an unknown kind its size and a digest, the
/// CRC-32 of its bytes:
///
///     19:14:05.123  #3  enrollment progress, 40 %
///     19:14:05.123  72144 bytes  3f2a9c01
///     {"time":1795201445.123,"size":72144,"digest":"3f2a9c01"}
class EventReceiver {
  public:
    /// `file` may be null; `limit` events are taken, all if 0.
    EventReceiver(frames::FrameFile* file, uint64_t limit, bool json)
            : mFile(file), mLimit(limit), mJson(json) {}

    /// To be told before the first event: others are passed over, and strokes may be drawn, or with
    /// JSON listed.
    void choose(const EventFilter& filter, bool draw) {
        mFilter = filter;
        mDraw = draw;
    }

    /// To be told before the first event: the receiver is done with the first of these. Until then
    /// a terminal shows the last event alone.
    void await(const EventGoal& goal) { mGoal = goal; }

    /// What ended the waiting, once it is over.
    std::optional<simulator::HandEvent> awaited();

    /// The callback of a client; `context` is the receiver.
    template <typename Record>
    static void onEvent(Record* record, void* context) {
        static_cast<EventReceiver*>(context)->take(record, sizeof(Record));
    }

    /// Prints a line about the service itself: "died" or "back".
    void tellOfService(const char* what);

    /// Waits until the receiver takes no more events, having enough of them or nowhere to write
    /// them; false when that did not happen in time.
    bool waitUntilDone(std::chrono::milliseconds patience);

    /// Takes no more events, whatever still arrives; returns how many were taken.
    uint64_t close();

  private:
    void take(const void* record, size_t size);
    void print(const void* record, size_t size);

    frames::FrameFile* const mFile;
    const uint64_t mLimit;
    const bool mJson;
    EventFilter mFilter;
    bool mDraw = false;
    EventGoal mGoal;

    std::mutex mLock;
    std::condition_variable mChanged;
    uint64_t mTaken = 0;
    bool mDone = false;
    std::optional<simulator::HandEvent> mAwaited;
    tools::LiveLine mLine{wordsDescriptor()};
};

/// The line of an event, or of one that came without a record, whose size is then 0.
std::string eventLine(std::chrono::system_clock::time_point when, const void* record, size_t size,
                      bool json);

/// The same, behind it a gesture's stroke: points in the JSON object, or else a drawing in lines of
/// their own.
std::string eventText(std::chrono::system_clock::time_point when, const void* record, size_t size,
                      bool json, bool unicode);

/// The line that tells that the service died or is back.
std::string serviceLine(std::chrono::system_clock::time_point when, const char* what, bool json);

}  // namespace pemaro::zelkctl
