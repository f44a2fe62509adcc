// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>
#include <unordered_map>

#include "tools/zelkctl/trace/TracedCall.h"

namespace pemaro::zelkctl {

/// One end of a call.
struct Party {
    int process = 0;  ///< 0: not known
    int thread = 0;
    std::string name;
};

/// Who calls and who is called: the names of processes, also of those that ended meanwhile.
class ProcessNames {
  public:
    /// `remember` tells the name of a thread that may have ended; `proc` is where processes are seen.
    explicit ProcessNames(std::function<std::string(int thread)> remember,
                          std::string proc = "/proc")
            : mRemember(std::move(remember)), mProc(std::move(proc)) {}

    Party caller(const TracedCall& call) { return party(call.fromProcess, call.fromThread); }
    Party callee(const TracedCall& call) { return party(call.toProcess, call.toThread); }

  private:
    Party party(int process, int thread);
    std::string nameOf(int process) const;
    int processOf(int thread) const;

    const std::function<std::string(int thread)> mRemember;
    const std::string mProc;
    std::unordered_map<int, std::string> mNames;
};

}  // namespace pemaro::zelkctl
