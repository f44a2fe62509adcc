// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace pemaro::tools {

// The exit statuses of the programs. A command that a signal ends before it is done has 128 and the
// signal's number.

constexpr int kExitSuccess = 0;
constexpr int kExitFailure = 1;
constexpr int kExitUsage = 2;
constexpr int kExitAbsent = 3;
constexpr int kExitTimeout = 4;
constexpr int kExitSignal = 128;

struct ExitStatus {
    int status;
    const char* meaning;
};

/// The same as the manual page tells them.
constexpr ExitStatus kExitStatuses[] = {
        {kExitSuccess, "Success; what lasts until it is told to stop was told so."},
        {kExitFailure,
         "A service refused, or a file, the standard output or what was received is not as it "
         "should be."},
        {kExitUsage, "The command line makes no sense; nothing was done."},
        {kExitAbsent,
         "A service, the service manager, the Binder driver or its trace events are not there, or "
         "the service died."},
        {kExitTimeout,
         "A call was not answered within the seconds of --timeout, or what --wait waits for did "
         "not come within those of --seconds."},
};

}  // namespace pemaro::tools
