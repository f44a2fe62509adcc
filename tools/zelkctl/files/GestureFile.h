// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "pemaro/IGestureManagerClient.h"

namespace pemaro::zelkctl {

/// Appends the gesture records of a file, one after another as `gesture watch --output` keeps them.
/// Empty, or what is wrong with the file: one that cannot be read, that does not hold whole records,
/// or with which there would be more than `limit`.
std::string readGestures(const std::string& path, size_t limit,
                         std::vector<IGestureManagerClient::GestureData>& records);

}  // namespace pemaro::zelkctl
