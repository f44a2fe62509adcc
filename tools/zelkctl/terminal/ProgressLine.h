// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <utility>

#include "tools/common/ProgressLine.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {

/// The progress of a command. With --json nothing is told.
///
///     ProgressLine progress("packing", "bytes");
///     while (… && progress.step(done, total)) {
class ProgressLine {
  public:
    /// What is done, and with what. Not shown where the same terminal shows what is made.
    ProgressLine(std::string what, std::string unit, bool isShown = true)
            : mLine(std::move(what), std::move(unit), isShown && !settings().json) {}

    /// To be called often. False when the command was asked to stop. With a total of 0, none is
    /// known.
    bool step(uint64_t done, uint64_t total) {
        mLine.step(done, total);
        return !mustStop();
    }

  private:
    tools::ProgressLine mLine;
};

}  // namespace pemaro::zelkctl
