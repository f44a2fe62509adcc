// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <fmt/core.h>

#include <string>

#include "pemaro/Status.h"
#include "tools/common/ExitStatus.h"

namespace pemaro::zelkctl {

/// Tells on stderr what went wrong, in one line or with --json in one object; returns the exit
/// status.
int fail(const std::string& problem, int exitStatus = tools::kExitFailure);

/// The same for a command line that makes no sense.
int failUsage(const std::string& problem);

/// The same for a service that is not there.
int failAbsent(const std::string& service);

/// The same for an operation that returned a status, and what it was about, if that helps.
///
///     zelkctl: restoreSession: Not Found (0x40000019): session 3
///     {"error":"…","operation":"restoreSession","status":1073741849,"code":"0x40000019",
///      "message":"Not Found","about":"session 3","exit":1}
int failStatus(const std::string& operation, int status, const std::string& about = "");

/// A status as it is written: 0x4000000B.
std::string statusCode(int status);

}  // namespace pemaro::zelkctl
