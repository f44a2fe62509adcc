// SPDX-License-Identifier: Apache-2.0

// How old the frames are when the data callback gets them, and how many are lost, over the real Binder driver
// with zelk-touchstack in a process of its own: by the rate of frames, and by when the writer of the ring
// signals a frame again that was not taken (0: never). ZELK_BENCH_SECONDS sets how long each recording takes;
// ZELK_BENCH_JSON names a file for the figures.

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "frames/Frame.h"
#include "pemaro/TouchCompanionClient.h"
#include "tests/driver/DriverSetting.h"

namespace pemaro::test {
namespace {

using Clock = std::chrono::steady_clock;

/// The ages of the frames that a client received, and the gaps between them.
class AgeCollector {
  public:
    static void onFrame(int, void* frame, unsigned long bytes, void* context) {
        const auto now = std::chrono::duration_cast<std::chrono::nanoseconds>(
                Clock::now().time_since_epoch());
        frames::FrameHeader header{};
        if (!frames::readFrameHeader(frame, bytes, &header)) return;
        static_cast<AgeCollector*>(context)->take(header, static_cast<uint64_t>(now.count()));
    }

    std::vector<double> sortedMilliseconds() const {
        std::lock_guard<std::mutex> guard(mLock);
        std::vector<double> sorted = mAges;
        std::sort(sorted.begin(), sorted.end());
        return sorted;
    }

    uint64_t lost() const {
        std::lock_guard<std::mutex> guard(mLock);
        return mLost;
    }

  private:
    void take(const frames::FrameHeader& header, uint64_t nowNs) {
        std::lock_guard<std::mutex> guard(mLock);
        mLost += header.sequence - mNext;
        mNext = header.sequence + 1;
        mAges.push_back(static_cast<double>(nowNs - header.timeNs) / 1e6);
    }

    mutable std::mutex mLock;
    std::vector<double> mAges;
    uint32_t mNext = 0;
    uint64_t mLost = 0;
};

double setting(const char* name, double otherwise) {
    const char* const text = getenv(name);
    return text == nullptr ? otherwise : strtod(text, nullptr);
}

/// One row for each recording, appended to the file that the environment names, if it does.
class Report {
  public:
    Report() {
        const char* const path = getenv("ZELK_BENCH_JSON");
        if (path != nullptr) mFile = fopen(path, "w");
        if (mFile != nullptr) fputs("{\"frames\": [", mFile);
        printf("%8s %10s %8s %8s %10s %10s %10s\n", "rate/s", "remind us", "frames", "lost",
               "p50 ms", "p99 ms", "max ms");
    }
    ~Report() {
        if (mFile == nullptr) return;
        fputs("\n]}\n", mFile);
        fclose(mFile);
    }
    Report(const Report&) = delete;
    Report& operator=(const Report&) = delete;

    void add(int rate, int remindUs, const std::vector<double>& ages, uint64_t lost) {
        const auto at = [&](size_t percent) { return ages[(ages.size() - 1) * percent / 100]; };
        printf("%8d %10d %8zu %8llu %10.3f %10.3f %10.3f\n", rate, remindUs, ages.size(),
               static_cast<unsigned long long>(lost), at(50), at(99), at(100));
        fflush(stdout);
        if (mFile == nullptr) return;
        fprintf(mFile,
                "%s\n{\"rate\": %d, \"remindUs\": %d, \"frames\": %zu, \"lost\": %llu, "
                "\"p50\": %.4f, \"p99\": %.4f, \"max\": %.4f}",
                mRows++ == 0 ? "" : ",", rate, remindUs, ages.size(),
                static_cast<unsigned long long>(lost), at(50), at(99), at(100));
    }

  private:
    FILE* mFile = nullptr;
    int mRows = 0;
};

void measure(Report& report, int rate, int remindUs) {
    TouchStack touchStack({"--rate", std::to_string(rate), "--ring-frames", "256", "--remind",
                           std::to_string(remindUs)});
    AgeCollector ages;
    const android::sp<TouchCompanionClient> client =
            new TouchCompanionClient(AgeCollector::onFrame, &ages);
    ASSERT_EQ(0, client->init());
    ASSERT_EQ(0, client->setRecordOutput(1));
    ASSERT_EQ(0, client->startRecord());
    std::this_thread::sleep_for(std::chrono::duration<double>(setting("ZELK_BENCH_SECONDS", 0.5)));
    ASSERT_EQ(0, client->stopRecord());
    const std::vector<double> sorted = ages.sortedMilliseconds();
    ASSERT_FALSE(sorted.empty());
    report.add(rate, remindUs, sorted, ages.lost());
}

TEST(FramesOverTheDriver, ComeSoonerWithASecondSignal) {
    Report report;
    if (setting("ZELK_BENCH_SECONDS", 0.5) < 0.5) {
        // Only to see that it works.
        for (const int remindUs : {0, 250}) measure(report, 60, remindUs);
        return;
    }
    for (const int rate : {60, 120, 240, 500, 1000, 2000, 4000}) {
        for (const int remindUs : {0, 250}) measure(report, rate, remindUs);
    }
    for (const int remindUs : {50, 100, 500, 1000, 2000}) measure(report, 60, remindUs);
}

}  // namespace
}  // namespace pemaro::test
