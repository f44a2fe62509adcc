// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"

namespace pemaro::zelkctl {

void addHandScanCommand(CLI::App& hand, Action& action) {
    using simulator::HandEvent;
    using Client = HandBiometricManagerClient;
    addHandActivityCommand(hand, action,
                           {"scan",
                            "Scan a hand",
                            "scan",
                            "scan",
                            &Client::scan,
                            nullptr,
                            nullptr,
                            "cancelScan",
                            &Client::cancelScan,
                            {HandEvent::kScanDone, {HandEvent::kCancelled}},
                            "Wait until the hand is scanned"});
}

}  // namespace pemaro::zelkctl
