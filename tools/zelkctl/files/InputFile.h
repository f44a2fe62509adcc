// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "tools/zelkctl/files/FileResult.h"

namespace pemaro::zelkctl {

/// Reads a file up to its end, or as many bytes of it as `most`: it may have no end.
FileResult readInputFile(const std::string& path, size_t most, std::string& bytes);

}  // namespace pemaro::zelkctl
