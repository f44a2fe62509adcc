// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "simulator/ServiceKind.h"

namespace pemaro::simulator {

/// A misbehaviour ordered for one operation of a service, in the text form
///
///     OPERATION=status:NUMBER     the operation does nothing and returns this status
///     OPERATION=delay:500ms       it is late by this time (ms or s)
///     OPERATION=die               the process ends at once, without an answer
///     getCblk=null                there is no control block
///
/// OPERATION is a member function of ITouchCompanionService, where a name with two overloads means
/// both; or one of a manager's service behind the manager's name:
/// touch.enable, gesture.addGesture, hand.scan.
struct Fault {
    enum class Kind { kStatus, kDelay, kDie, kNull };

    ServiceKind service = ServiceKind::kCompanion;
    std::string operation;
    Kind kind = Kind::kStatus;
    int status = 0;
    std::chrono::milliseconds delay{0};

    /// Null, with the reason in `*problem`, when `text` is no fault.
    static std::optional<Fault> parse(const std::string& text, std::string* problem);

    /// All OPERATIONs.
    static std::vector<std::string> operations();
};

/// The faults in force for a service. Any thread may call.
class FaultTable {
  public:
    /// The process's exit status when it dies at an operation.
    static constexpr int kDeathStatus = 70;

    void add(const Fault& fault);
    void clear();

    /// Runs the faults of an operation: sleeps, or ends the process. A value is what the operation
    /// is to return instead of doing anything (0 for a null block).
    std::optional<int> strike(const char* operation);

  private:
    std::mutex mLock;
    std::map<std::string, std::vector<Fault>> mFaults;
};

}  // namespace pemaro::simulator
