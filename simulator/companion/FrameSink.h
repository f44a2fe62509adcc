// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>

namespace pemaro::simulator {

/// Where a recording's frames go. Used by one thread at a time.
class FrameSink {
  public:
    virtual ~FrameSink() = default;

    /// Takes a whole frame. False when there is no room for it now; nothing is taken then.
    virtual bool put(const void* frame, size_t length) = 0;

    /// Tells whoever takes the frames once more that there are some. False when all are taken, or
    /// nobody needs to be told.
    virtual bool remind() { return false; }
};

}  // namespace pemaro::simulator
