// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <atomic>
#include <cstdint>
#include <string>

namespace pemaro::test {

/// What one recording of a soak client brought. It is kept up to date frame by frame, so that it is true
/// after a SIGKILL as well.
struct SoakRecording {
    std::atomic<uint64_t> received;  ///< frames that came, all of them intact
    std::atomic<uint64_t> missing;   ///< sequence numbers left out between them
    std::atomic<uint64_t>
            written;  ///< frames in the ring so far, as its index told with the last of them
};

/// What a soak client used, as ProcessUsage has it.
struct SoakUsage {
    std::atomic<int> threads, descriptors, mappings, memoryKiB;
};

/// What a soak client has to tell, in a file that it and the test have mapped.
struct SoakReport {
    static constexpr uint32_t kMostRecordings = 10000;

    std::atomic<uint32_t> ready;       ///< the client is at work
    std::atomic<uint64_t> operations;  ///< done so far
    std::atomic<uint64_t> events;      ///< gestures and hand events that came, all of them intact
    std::atomic<uint32_t> recordings;  ///< started with success
    SoakUsage atWork;                  ///< when it was ready
    SoakUsage afterwards;  ///< when it had let go of everything, zeros where it was killed
    SoakRecording recording[kMostRecordings];
    char problem[256];  ///< the first thing that should not have happened

    /// Keeps the first problem.
    void fail(const std::string& what);
};

/// Maps the file, which is made with `create`; null when that fails.
SoakReport* mapSoakReport(const std::string& path, bool create);
void unmapSoakReport(SoakReport* report);

}  // namespace pemaro::test
