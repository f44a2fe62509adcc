// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::frames {

/// The descriptor of this process that a path leads to, as /dev/stdout, /dev/fd/3 and /proc/self/fd/3 do,
/// or a link to one of them; -1 for every other path. It may be closed.
///
/// Such a file is the caller's, who may be adding to it: it is written through the descriptor. Opened by
/// its name it would begin anew.
int ownDescriptor(const std::string& path);

}  // namespace pemaro::frames
