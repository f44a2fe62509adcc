// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::simulator {

/// Makes these bytes all that a file holds; a status of Status.h. The old file stays what it was until
/// the new one, which takes its place, is complete. What a link leads to is replaced and not the link,
/// and the new file has the owner and the permissions of the old one. What is no file, a device or a
/// FIFO, is written to; it never waits for a FIFO's reader.
int writeWholeFile(const std::string& path, const std::string& bytes);

}  // namespace pemaro::simulator
