// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <algorithm>
#include <cstdint>

#include "tools/zelkctl/services/Interfaces.h"

namespace pemaro::zelkctl {

/// How a call came out, as far as the driver knows. The status that an operation returned is inside the
/// reply, and not seen.
enum class CallEnd {
    kAnswered,
    kRefused,      ///< the service's side ended it with an error, and without a reply
    kOneWay,       ///< nobody waits for an answer
    kDead,         ///< the process that was called ended
    kUndelivered,  ///< the driver could not hand it over, or its reply
    kOpen,         ///< no answer was seen
};

/// A call of a known operation, from its request to its reply. Times are monotonic nanoseconds, and 0
/// where they are not known; so are processes.
struct TracedCall {
    const KnownInterface* interface = nullptr;
    uint32_t code = 0;
    int number = 0;
    CallEnd end = CallEnd::kOpen;
    int64_t sent = 0;
    int64_t received = 0;  ///< the service begins
    int64_t replied = 0;   ///< the service is done
    int64_t returned = 0;  ///< the caller has the reply, or knows that there is none
    int fromProcess = 0;
    int fromThread = 0;
    int toProcess = 0;
    int toThread = 0;
    uint64_t requestBytes = 0;
    uint64_t replyBytes = 0;

    bool failed() const {
        return end == CallEnd::kRefused || end == CallEnd::kDead || end == CallEnd::kUndelivered;
    }
    /// How long the caller waited; negative when that is not known.
    int64_t took() const { return std::max(replied, returned) - sent; }
    bool isTimed() const { return std::max(replied, returned) != 0; }
};

}  // namespace pemaro::zelkctl
