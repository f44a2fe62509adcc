// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/EventReceiver.h"

#include <fmt/core.h>
#include <time.h>

#include <cstdio>

#include "frames/Checksum.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::system_clock;

int64_t milliseconds(Clock::time_point when) {
    return std::chrono::duration_cast<std::chrono::milliseconds>(when.time_since_epoch()).count();
}

std::string timeOfDay(Clock::time_point when) {
    const int64_t ms = milliseconds(when);
    const time_t seconds = ms / 1000;
    tm local{};
    localtime_r(&seconds, &local);
    return fmt::format("{:02}:{:02}:{:02}.{:03}", local.tm_hour, local.tm_min, local.tm_sec,
                       ms % 1000);
}

std::string jsonTime(Clock::time_point when) {
    const int64_t ms = milliseconds(when);
    return fmt::format("\"time\":{}.{:03}", ms / 1000, ms % 1000);
}

void printLine(const std::string& line) {
    fmt::print("{}\n", line);
    fflush(stdout);
}

}  // namespace

std::string eventLine(Clock::time_point when, const void* record, size_t size, bool json) {
    const std::string digest = fmt::format("{:08x}", frames::crc32(record, size));
    return json ? fmt::format("{{{},\"size\":{},\"digest\":\"{}\"}}", jsonTime(when), size, digest)
                : fmt::format("{}  {} bytes  {}", timeOfDay(when), size, digest);
}

std::string serviceLine(Clock::time_point when, const char* what, bool json) {
    return json ? fmt::format("{{{},\"service\":\"{}\"}}", jsonTime(when), what)
                : fmt::format("{}  the service {}", timeOfDay(when), what);
}

void EventReceiver::tellOfService(const char* what) {
    std::lock_guard<std::mutex> guard(mLock);
    printLine(serviceLine(Clock::now(), what, mJson));
}

bool EventReceiver::waitUntilDone(std::chrono::milliseconds patience) {
    std::unique_lock<std::mutex> guard(mLock);
    return mChanged.wait_for(guard, patience, [this] { return mDone; });
}

uint64_t EventReceiver::close() {
    std::lock_guard<std::mutex> guard(mLock);
    mDone = true;
    return mTaken;
}

void EventReceiver::take(const void* record, size_t size) {
    std::lock_guard<std::mutex> guard(mLock);
    if (mDone) {
        return;
    }
    // The library hands on a record that the service cut short as none at all.
    const size_t present = record == nullptr ? 0 : size;
    if (mFile != nullptr && present != 0 && !mFile->write(record, present)) {
        mDone = true;
    } else {
        printLine(eventLine(Clock::now(), record, present, mJson));
        mTaken += 1;
        mDone = mTaken == mLimit;
    }
    if (mDone) {
        mChanged.notify_all();
    }
}

}  // namespace pemaro::zelkctl
