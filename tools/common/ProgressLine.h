// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstdint>
#include <string>

#include "tools/common/LiveLine.h"

namespace pemaro::tools {

/// How far a program is that works through a lot by itself. When that takes longer than a second, a
/// line on the standard error tells it, if that is a terminal, and is gone when the work is done.
class ProgressLine {
  public:
    /// What is done, and with what: "reading", "bytes".
    ProgressLine(std::string what, std::string unit, bool isShown = true);
    ~ProgressLine();

    /// To be called often. With a total of 0, none is known.
    void step(uint64_t done, uint64_t total);

  private:
    using Clock = std::chrono::steady_clock;

    const std::string mWhat;
    const std::string mUnit;
    LiveLine mLine;
    const bool mIsShown;
    Clock::time_point mDue;
};

/// How far that is, as in "reading: 512 of 2048 bytes, 25 %".
std::string progressText(const std::string& what, uint64_t done, uint64_t total,
                         const std::string& unit);

}  // namespace pemaro::tools
