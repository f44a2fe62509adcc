// SPDX-License-Identifier: Apache-2.0
#include "tools/common/ProgressLine.h"

#include <fmt/core.h>
#include <unistd.h>

#include <utility>

namespace pemaro::tools {
namespace {

/// What takes no longer needs no word.
constexpr std::chrono::milliseconds kPatience(1000);
constexpr std::chrono::milliseconds kRedrawPeriod(200);

}  // namespace

ProgressLine::ProgressLine(std::string what, std::string unit, bool isShown)
        : mWhat(std::move(what)),
          mUnit(std::move(unit)),
          mLine(STDERR_FILENO),
          mIsShown(isShown && mLine.isTerminal()),
          mDue(Clock::now() + kPatience) {}

ProgressLine::~ProgressLine() {
    mLine.clear();
}

void ProgressLine::step(uint64_t done, uint64_t total) {
    if (!mIsShown) {
        return;
    }
    const Clock::time_point now = Clock::now();
    if (now >= mDue) {
        mLine.show(progressText(mWhat, done, total, mUnit));
        mDue = now + kRedrawPeriod;
    }
}

std::string progressText(const std::string& what, uint64_t done, uint64_t total,
                         const std::string& unit) {
    if (total == 0) {
        return fmt::format("{}: {} {}", what, done, unit);
    }
    const double part = static_cast<double>(done) / static_cast<double>(total);
    return fmt::format("{}: {} of {} {}, {:.0f} %", what, done, total, unit, 100 * part);
}

}  // namespace pemaro::tools
