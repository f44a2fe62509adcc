// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"

namespace pemaro::zelkctl {

void addHandEnrollCommand(CLI::App& hand, Action& action) {
    using simulator::HandEvent;
    using Client = HandBiometricManagerClient;
    addHandActivityCommand(
            hand, action,
            {"enroll",
             "Enroll a hand as a new profile",
             "enrollment",
             "startEnrollment",
             &Client::startEnrollment,
             "stopEnrollment",
             &Client::stopEnrollment,
             "stopEnrollment",
             &Client::stopEnrollment,
             {HandEvent::kEnrollmentDone, {HandEvent::kEnrollmentStopped, HandEvent::kCancelled}},
             "Wait until the hand is enrolled"});
}

}  // namespace pemaro::zelkctl
