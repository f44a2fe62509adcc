// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"

namespace pemaro::zelkctl {

void addHandMatchCommand(CLI::App& hand, Action& action) {
    using simulator::HandEvent;
    using Client = HandBiometricManagerClient;
    addHandActivityCommand(
            hand, action,
            {"match",
             "Match hands against the profiles",
             "matching",
             "startMatching",
             &Client::startMatching,
             "stopMatching",
             &Client::stopMatching,
             "stopMatching",
             &Client::stopMatching,
             {HandEvent::kMatched,
              {HandEvent::kNotMatched, HandEvent::kMatchingStopped, HandEvent::kCancelled}},
             "Wait until a hand is matched; one that is like no profile is a "
             "failure"});
}

}  // namespace pemaro::zelkctl
