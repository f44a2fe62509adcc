// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "tools/zelkctl/trace/BinderEvent.h"
#include "tools/zelkctl/trace/Tracefs.h"

namespace pemaro::zelkctl {

/// Why the Binder driver's events cannot be read here, and what to do; empty when they can. Nothing is
/// mounted or made by asking.
std::string tracingProblem();

/// The driver's events, read from an instance of the kernel's tracing that is ours alone: what others
/// trace is not touched, and nothing is left of it. What a process that was killed left behind is
/// removed by the next.
class Tracing {
  public:
    /// Null when that fails, with the reason in `problem`. REQUIRES: there is no tracingProblem().
    static std::unique_ptr<Tracing> start(std::string* problem);

    ~Tracing();
    Tracing(const Tracing&) = delete;
    Tracing& operator=(const Tracing&) = delete;

    /// Adds all events that happened until now, of all processors, in no order.
    void read(std::vector<BinderEvent>* events);

    /// How many events did not find room, so far.
    uint64_t lost() const;

    /// The name that the kernel remembers of a thread, which may have ended; empty when it has none.
    static std::string nameOfThread(int thread);

    /// Removes the instance while nothing is read from it; from any thread.
    void remove() const;

  private:
    Tracing(tracefs_instance* instance, tep_handle* formats, std::string folder);

    bool enable(std::string* problem);
    static int takeRecord(tep_event* event, tep_record* record, int cpu, void* context);

    tracefs_instance* const mInstance;
    tep_handle* const mFormats;
    const std::string mFolder;
    std::vector<BinderEvent>* mEvents = nullptr;
};

}  // namespace pemaro::zelkctl
