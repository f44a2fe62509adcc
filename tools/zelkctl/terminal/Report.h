// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <fmt/core.h>

#include <cstdio>
#include <string>

#include "pemaro/Status.h"
#include "tools/common/CommandLine.h"

namespace pemaro::zelkctl {

/// Tells in one line on stderr what went wrong; the exit status of a failed command.
inline int fail(const std::string& problem) {
    fflush(stdout);
    fmt::print(stderr, "zelkctl: {}\n", problem);
    return tools::kExitFailure;
}

/// The same for a service that is not there.
inline int failAbsent(const std::string& service) {
    return fail(fmt::format("the service {} is not running", service));
}

/// The same for an operation that returned a status, and what it was about, if that helps.
inline int failStatus(const std::string& operation, int status, const std::string& detail = "") {
    return fail(fmt::format("{}: {}{}", operation, errStr(status),
                            detail.empty() ? "" : " (" + detail + ")"));
}

}  // namespace pemaro::zelkctl
