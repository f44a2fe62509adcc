// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/CallSummary.h"

#include <fmt/core.h>

#include <algorithm>

#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/trace/CallText.h"

namespace pemaro::zelkctl {
// ---- durations -----------------------------------------------------------------------------------

// Below 64 a slot for each number; above, 64 slots from each power of two to the next.

size_t Durations::slotOf(int64_t nanoseconds) {
    const auto number = static_cast<uint64_t>(std::max<int64_t>(nanoseconds, 0));
    if (number < kSteps) {
        return number;
    }
    const int shift = 63 - __builtin_clzll(number) - kStepBits;
    return static_cast<size_t>(shift) * kSteps + (number >> shift);
}

int64_t Durations::highestIn(size_t slot) {
    if (slot < 2 * kSteps) {
        return static_cast<int64_t>(slot);
    }
    const size_t shift = slot / kSteps - 1;
    return static_cast<int64_t>(((slot - shift * kSteps + 1) << shift) - 1);
}

void Durations::add(int64_t nanoseconds) {
    mCounts[slotOf(nanoseconds)] += 1;
    mCount += 1;
    mLongest = std::max(mLongest, nanoseconds);
}

int64_t Durations::percentile(int percent) const {
    const uint64_t rank = (mCount * static_cast<uint64_t>(percent) + 99) / 100;
    uint64_t seen = 0;
    for (size_t slot = 0; slot < mCounts.size(); ++slot) {
        seen += mCounts[slot];
        if (seen >= rank && seen > 0) {
            return std::min(highestIn(slot), mLongest);
        }
    }
    return mLongest;
}

// ---- the summary ---------------------------------------------------------------------------------

void CallSummary::add(const TracedCall& call) {
    auto row = std::find_if(mRows.begin(), mRows.end(), [&call](const Row& known) {
        return known.first.interface == call.interface && known.first.code == call.code;
    });
    if (row == mRows.end()) {
        row = mRows.insert(mRows.end(), Row{});
        row->first = call;
    }
    row->calls += 1;
    row->failed += call.failed() ? 1 : 0;
    row->requestBytes += call.requestBytes;
    row->replyBytes += call.replyBytes;
    if (call.isTimed()) {
        row->took.add(call.took());
    }
    mCalls += 1;
    mFailed += call.failed() ? 1 : 0;
}

std::vector<const CallSummary::Row*> CallSummary::sorted() const {
    std::vector<const Row*> rows;
    for (const Row& row : mRows) {
        rows.push_back(&row);
    }
    std::stable_sort(rows.begin(), rows.end(),
                     [](const Row* one, const Row* other) { return one->calls > other->calls; });
    return rows;
}

std::vector<std::string> CallSummary::table() const {
    std::vector<std::string> lines = {fmt::format("{:>8}{:>8}{:>14}{:>14}{:>14}{:>12}{:>12}  {}",
                                                  "calls", "failed", "p50", "p99", "max", "sent",
                                                  "received", "operation")};
    for (const Row* row : sorted()) {
        const auto shown = [row](int64_t nanoseconds) {
            return row->took.isEmpty() ? "-" : millisecondsText(nanoseconds);
        };
        lines.push_back(fmt::format("{:>8}{:>8}{:>14}{:>14}{:>14}{:>12}{:>12}  {}", row->calls,
                                    row->failed, shown(row->took.percentile(50)),
                                    shown(row->took.percentile(99)), shown(row->took.longest()),
                                    row->requestBytes, row->replyBytes, callName(row->first)));
    }
    return lines;
}

std::vector<std::string> CallSummary::jsonLines() const {
    std::vector<std::string> lines;
    for (const Row* row : sorted()) {
        JsonObject object;
        object.add("service", row->first.interface->word)
                .add("interface", row->first.interface->descriptor)
                .add("operation", operationName(*row->first.interface, row->first.code))
                .add("code", static_cast<int64_t>(row->first.code))
                .add("calls", static_cast<int64_t>(row->calls))
                .add("failed", static_cast<int64_t>(row->failed))
                .add("request", static_cast<int64_t>(row->requestBytes))
                .add("reply", static_cast<int64_t>(row->replyBytes));
        if (!row->took.isEmpty()) {
            object.addReal("p50", secondsOf(row->took.percentile(50)))
                    .addReal("p99", secondsOf(row->took.percentile(99)))
                    .addReal("max", secondsOf(row->took.longest()));
        }
        lines.push_back(object.text());
    }
    return lines;
}

}  // namespace pemaro::zelkctl
