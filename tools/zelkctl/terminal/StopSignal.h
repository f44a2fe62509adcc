// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace pemaro::zelkctl {

/// While one lives, SIGINT and SIGTERM ask the command to end instead of ending the process, once: a
/// second one has its usual effect, should the command be stuck.
class StopSignal {
  public:
    StopSignal();
    ~StopSignal();
    StopSignal(const StopSignal&) = delete;
    StopSignal& operator=(const StopSignal&) = delete;

    bool caught() const;
};

}  // namespace pemaro::zelkctl
