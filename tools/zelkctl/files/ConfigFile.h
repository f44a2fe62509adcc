// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "tools/zelkctl/files/FileResult.h"

namespace pemaro::zelkctl {

/// Reads a file whole; one of more than `limit` bytes is refused.
FileResult readConfigFile(const std::string& path, size_t limit, std::string& bytes);

}  // namespace pemaro::zelkctl
