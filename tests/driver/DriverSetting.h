// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "tests/support/ChildProcess.h"

namespace pemaro::test {

// Tests over the real Binder driver. A program that links this library has a servicemanager of its
// own while its tests run, and Binder threads of its own; where the driver cannot be used, the
// program fails with one sentence and runs no test. Two such programs that run at once need a Binder
// device each (with-own-driver).

/// The path of a program of this build, and of one of the platform's.
std::string binary(const std::string& name);
std::string platformBinary(const std::string& name);

/// A zelk-touchstack with these options, running and registered. When it does not come up, the test
/// fails and what comes after finds no service.
class TouchStack {
  public:
    explicit TouchStack(const std::vector<std::string>& options = {});

    ChildProcess& process() { return mProcess; }

    /// Waits for a line that it prints about its clients.
    bool awaitLine(const std::string& text) { return mProcess.awaitOutput(text + "\n"); }

    /// Ends it without warning.
    void kill();

  private:
    ChildProcess mProcess;
};

}  // namespace pemaro::test
