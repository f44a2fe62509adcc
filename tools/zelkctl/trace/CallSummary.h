// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "tools/zelkctl/trace/TracedCall.h"

namespace pemaro::zelkctl {

/// How long calls took, in a space that does not grow with their number: a duration is known to one part
/// in 64, the longest exactly.
class Durations {
  public:
    void add(int64_t nanoseconds);
    bool isEmpty() const { return mCount == 0; }
    /// The smallest that so many percent are not above. REQUIRES: there is one.
    int64_t percentile(int percent) const;
    int64_t longest() const { return mLongest; }

  private:
    static constexpr int kStepBits = 6;
    static constexpr size_t kSteps = size_t{1} << kStepBits;

    static size_t slotOf(int64_t nanoseconds);
    static int64_t highestIn(size_t slot);

    std::array<uint32_t, kSteps*(64 - kStepBits)> mCounts{};
    uint64_t mCount = 0;
    int64_t mLongest = 0;
};

/// The calls of each operation, counted.
class CallSummary {
  public:
    void add(const TracedCall& call);

    uint64_t calls() const { return mCalls; }
    uint64_t failed() const { return mFailed; }

    /// The operations below a heading, those that are called most on top.
    std::vector<std::string> table() const;
    /// The same, an object each.
    std::vector<std::string> jsonLines() const;

  private:
    struct Row {
        TracedCall first;
        uint64_t calls = 0;
        uint64_t failed = 0;
        uint64_t requestBytes = 0;
        uint64_t replyBytes = 0;
        Durations took;
    };
    std::vector<const Row*> sorted() const;

    std::vector<Row> mRows;
    uint64_t mCalls = 0;
    uint64_t mFailed = 0;
};

}  // namespace pemaro::zelkctl
