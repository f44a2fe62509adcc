// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>
#include <vector>

namespace pemaro::bench {

using Call = std::function<void()>;

/// An operation called through proxy and stub in one process, and by hand: the same parcels written,
/// handed to a binder and read there, without a table, a check of anything but the token, or a log.
struct CallPair {
    std::string name;
    Call zelk;
    Call bare;
};

std::vector<CallPair> calls();

}  // namespace pemaro::bench
