// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstdint>
#include <string>

#include "tools/common/LiveLine.h"

namespace pemaro::zelkctl {

/// How far a command is that works through a lot by itself. When that takes longer than a second, a
/// line on the standard error tells it, if that is a terminal, and is gone when the work is done.
/// With --json nothing is told.
///
///     ProgressLine progress("packing", "bytes");
///     while (… && progress.step(done, total)) {
class ProgressLine {
  public:
    /// What is done, and with what. Not shown where the same terminal shows what is made.
    ProgressLine(std::string what, std::string unit, bool isShown = true);
    ~ProgressLine();

    /// To be called often. False when the command was asked to stop. With a total of 0, none is
    /// known.
    bool step(uint64_t done, uint64_t total);

  private:
    using Clock = std::chrono::steady_clock;

    const std::string mWhat;
    const std::string mUnit;
    tools::LiveLine mLine;
    const bool mIsShown;
    Clock::time_point mDue;
};

/// How far that is, as in "reading: 512 of 2048 bytes, 25 %".
std::string progressText(const std::string& what, uint64_t done, uint64_t total,
                         const std::string& unit);

}  // namespace pemaro::zelkctl
