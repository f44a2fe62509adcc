// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <set>
#include <string>

#include "tools/zelkctl/trace/ProcessNames.h"
#include "tools/zelkctl/trace/TracedCall.h"

namespace pemaro::zelkctl {

/// Calls in the JSON form of Chrome's trace events, which Perfetto's viewer opens: a slice on the
/// caller's thread while it waits, one on the service's thread while that works, and an arrow from the
/// one to the other. Times are monotonic microseconds.
///
///     {"displayTimeUnit":"ms","traceEvents":[
///     {"ph":"M","name":"process_name","pid":146,…},
///     {"ph":"X","name":"touch.isSupported","pid":146,"tid":147,"ts":…,"dur":…,"args":{…}}
///     ]}
class Timeline {
  public:
    /// The next piece of the file: what tells of this call, behind what came before.
    std::string add(const TracedCall& call, const Party& caller, const Party& callee);

    /// The last piece. Pieces with no call between them are a file as well.
    std::string end();

  private:
    void begin();
    void append(const std::string& event);
    void nameProcess(const Party& party);

    std::string mPiece;
    bool mHasBegun = false;
    bool mHasEvents = false;
    std::set<int> mNamed;
};

}  // namespace pemaro::zelkctl
