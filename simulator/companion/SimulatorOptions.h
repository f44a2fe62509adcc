// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "frames/Frame.h"

namespace pemaro::simulator {

class Replay;
class TouchScreen;

/// Debug commands without numbers, each with what yields the lines of its answer. Called with the
/// service's lock held.
using StateCommands = std::map<std::string, std::function<std::vector<std::string>()>>;

/// What kind of touch stack is simulated.
struct SimulatorOptions {
    static constexpr uint32_t kMinFrameBytes = sizeof(frames::FrameHeader);
    static constexpr uint32_t kMaxFrameBytes = 1 << 20;
    static constexpr uint32_t kMaxRingFrames = 1 << 16;
    static constexpr uint64_t kMaxRingBytes = uint64_t{256} << 20;
    static constexpr uint32_t kMaxFingers = 10;
    static constexpr double kMaxRate = 100000;
    static constexpr double kMaxSpeed = 1000;
    static constexpr uint32_t kMaxRemindUs = 1000000;

    double rate = 240;           ///< frames a second; 0: as fast as the client takes them
    uint32_t frameBytes = 4096;  ///< the packet size, and a slot of the ring
    uint32_t ringFrames = 64;    ///< slots of the ring
    uint32_t fingers = 3;
    /// Whose fingers are drawn, if set; then `fingers` means nothing.
    std::shared_ptr<TouchScreen> touchScreen;
    /// Played instead of drawing frames, if set; no frame of it is longer than frameBytes. Then `rate`,
    /// `fingers` and the record filter mean nothing.
    std::shared_ptr<const Replay> replay;
    double speed = 1;               ///< of the replay; 0: as fast as the client takes them
    bool loop = false;              ///< whether the replay begins anew behind its end
    uint32_t remindUs = 250;        ///< when to signal a frame again that was not taken; 0: never
    std::string configPath;         ///< the configuration's own place; empty: it has none
    std::string authText = "zelk";  ///< what setAuth() accepts

    /// What the services beside this one tell of their state.
    StateCommands states;

    /// Told one line about each thing that happens, if set. Called with the service's lock held.
    std::function<void(const std::string&)> narrate;
};

}  // namespace pemaro::simulator
