// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "pemaro/SerializableMap.h"
#include "simulator/companion/Device.h"
#include "simulator/companion/SimulatorOptions.h"

namespace pemaro::simulator {

/// Answers the request maps of sendCommand(): debug commands, record filters and properties.
///
/// The debug commands are
///     calibrate [SEED]     measures the calibration table anew
///     status               one line about the device
///     version              who answers
///     selftest             a report of several lines
///     factoryreset         forgets all settings; needs authentication
///     dump [BYTES]         an answer of this length, 65536 if not told, 262144 at most
///     keys                 the keys of the configuration, one a line
///     sessions             the sessions that can be restored, one a line
///     fail                 always fails, with 0x40000010
/// and those of the services beside it that tell their state. The action SET_CONFIG takes new values
/// for keys of the configuration, its parameters, all or none. A command without a text of its own answers with the length 0.
class CommandInterpreter {
  public:
    /// `states` are further commands.
    explicit CommandInterpreter(Device& device, StateCommands states = {})
            : mDevice(device), mStates(std::move(states)) {}

    /// Returns a status of Status.h; `response` is filled when it is 0.
    int answer(const SerializableMap& request, SerializableMap& response);

  private:
    int answerDebug(const SerializableMap& body, SerializableMap& response);
    int answerProperty(const SerializableMap& body, SerializableMap& response);
    int runCommand(const std::string& name, const std::vector<int>& numbers, std::string* text);
    std::string selftest() const;

    Device& mDevice;
    const StateCommands mStates;
};

}  // namespace pemaro::simulator
