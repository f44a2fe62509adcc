// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/Status.h"

namespace pemaro::zelkctl {

/// How a file fared: a status that names the kind of failure, and what it was in particular.
struct FileResult {
    int status = STATUS_NO_ERROR;
    std::string detail;

    bool isGood() const { return status == STATUS_NO_ERROR; }
};

/// Reads a file whole; one of more than `limit` bytes is refused.
FileResult readConfigFile(const std::string& path, size_t limit, std::string& bytes);

/// Replaces a file by one with these bytes, or, when that fails, leaves the old one as it was. What
/// a link leads to is replaced and not the link; what is no file is written to; "-" is the standard
/// output.
FileResult writeConfigFile(const std::string& path, const std::string& bytes);

}  // namespace pemaro::zelkctl
