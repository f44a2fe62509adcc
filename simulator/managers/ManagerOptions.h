// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>

namespace pemaro::simulator {

/// What kind of managers are simulated beside the touch companion service.
struct ManagerOptions {
    static constexpr double kMaxRate = 1000;
    static constexpr uint32_t kMaxUserGestures = 1000;
    static constexpr uint32_t kMaxHandProfiles = 100;

    double gestureRate = 2;      ///< gestures a second, of each manager that has some to report
    double handRate = 5;         ///< steps a second of what goes on with a hand
    uint32_t userGestures = 10;  ///< how many the user can define
    uint32_t handProfiles = 5;   ///< how many hands can be enrolled
    size_t queueRecords = 32;    ///< how many events wait for a slow subscriber

    /// Told one line about each thing that happens, if set. Called with a service's lock held.
    std::function<void(const std::string&)> narrate;
};

}  // namespace pemaro::simulator
