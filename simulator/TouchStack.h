// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <set>
#include <string>
#include <utility>
#include <vector>

#include "simulator/ServiceKind.h"
#include "simulator/companion/SimulatorOptions.h"
#include "simulator/companion/TouchCompanionSimulator.h"
#include "simulator/faults/Fault.h"
#include "simulator/managers/GestureManagerSimulator.h"
#include "simulator/managers/HandBiometricManagerSimulator.h"
#include "simulator/managers/ManagerOptions.h"
#include "simulator/managers/TouchManagerSimulator.h"

namespace pemaro::simulator {

/// The services of one process, or some of them.
class TouchStack {
  public:
    struct Options {
        std::set<ServiceKind> services{std::begin(kServiceKinds), std::end(kServiceKinds)};
        SimulatorOptions companion;
        ManagerOptions managers;
    };

    explicit TouchStack(const Options& options);
    ~TouchStack();

    /// Orders a fault; nothing happens when its service is switched off.
    void order(const Fault& fault);

    /// Registers all services; empty, or why the service manager refused one.
    std::string registerAll();

    /// The services with the names under which they are registered.
    std::vector<std::pair<std::string, android::sp<android::IBinder>>> services() const;

    /// Ends all that goes on, and forgets all clients.
    void shutDown();

    /// A line for each service about what it has done.
    std::vector<std::string> summary();

  private:
    android::sp<android::IBinder> binderOf(ServiceKind service) const;

    android::sp<TouchCompanionSimulator> mCompanion;
    android::sp<TouchManagerSimulator> mTouch;
    android::sp<GestureManagerSimulator> mGesture;
    android::sp<HandBiometricManagerSimulator> mHand;
};

}  // namespace pemaro::simulator
