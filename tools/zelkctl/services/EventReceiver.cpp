// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/EventReceiver.h"

#include <fmt/core.h>

#include <algorithm>

#include "frames/Checksum.h"
#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/Supervisor.h"
#include "tools/zelkctl/terminal/TerminalTraits.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::system_clock;

std::string digestOf(const void* record, size_t size) {
    return fmt::format("{:08x}", frames::crc32(record, size));
}

std::string jsonLine(Clock::time_point when, const void* record, size_t size,
                     const EventRecord& event, bool stroke) {
    JsonObject object;
    object.addTime("time", when).add("size", static_cast<int64_t>(size));
    object.add("digest", digestOf(record, size));
    event.describe(object, stroke);
    return object.text();
}

std::string plainLine(Clock::time_point when, const void* record, size_t size,
                      const EventRecord& event) {
    const std::string words = event.isKnown()
                                      ? event.words()
                                      : fmt::format("{} bytes  {}", size, digestOf(record, size));
    return fmt::format("{}  {}", timeOfDay(when), words);
}

}  // namespace

std::string eventLine(Clock::time_point when, const void* record, size_t size, bool json) {
    const EventRecord event = EventRecord::read(record, size);
    return json ? jsonLine(when, record, size, event, false) : plainLine(when, record, size, event);
}

std::string eventText(Clock::time_point when, const void* record, size_t size, bool json,
                      bool unicode) {
    const EventRecord event = EventRecord::read(record, size);
    if (json) {
        return jsonLine(when, record, size, event, true);
    }
    std::string text = plainLine(when, record, size, event);
    for (const std::string& line : event.drawing(unicode)) {
        text += "\n" + line;
    }
    return text;
}

std::string serviceLine(Clock::time_point when, const char* what, bool json) {
    return json ? JsonObject().addTime("time", when).add("service", what).text()
                : fmt::format("{}  the service {}", timeOfDay(when), what);
}

bool EventGoal::isEndedBy(simulator::HandEvent event) const {
    return reached &&
           (event == *reached || std::find(missed.begin(), missed.end(), event) != missed.end());
}

void EventReceiver::tellOfService(const char* what) {
    std::lock_guard<std::mutex> guard(mLock);
    say(serviceLine(Clock::now(), what, mJson));
}

bool EventReceiver::waitUntilDone(std::chrono::milliseconds patience) {
    std::unique_lock<std::mutex> guard(mLock);
    return mChanged.wait_for(guard, patience, [this] { return mDone; });
}

std::optional<simulator::HandEvent> EventReceiver::awaited() {
    std::lock_guard<std::mutex> guard(mLock);
    return mAwaited;
}

uint64_t EventReceiver::close() {
    std::lock_guard<std::mutex> guard(mLock);
    mDone = true;
    mLine.end();
    return mTaken;
}

void EventReceiver::print(const void* record, size_t size) {
    if (mGoal.reached && !mAwaited && !mJson && mLine.isTerminal()) {
        hideCall();
        mLine.show(eventLine(Clock::now(), record, size, false));
        return;
    }
    mLine.clear();
    say(mDraw ? eventText(Clock::now(), record, size, mJson, terminalTraits().unicode)
              : eventLine(Clock::now(), record, size, mJson));
}

void EventReceiver::take(const void* record, size_t size) {
    std::lock_guard<std::mutex> guard(mLock);
    if (mDone) {
        return;
    }
    // The library hands on a record that the service cut short as none at all.
    const size_t present = record == nullptr ? 0 : size;
    if (!mFilter.isEmpty() && !EventRecord::read(record, present).passes(mFilter)) {
        return;
    }
    if (mFile != nullptr && present != 0 && !mFile->write(record, present)) {
        mDone = true;
    } else {
        const std::optional<simulator::HandEvent> event =
                EventRecord::read(record, present).handEvent();
        if (event && mGoal.isEndedBy(*event)) {
            mAwaited = event;
        }
        print(record, present);
        mTaken += 1;
        mDone = mTaken == mLimit || mAwaited;
    }
    if (mDone) {
        mChanged.notify_all();
    }
}

}  // namespace pemaro::zelkctl
