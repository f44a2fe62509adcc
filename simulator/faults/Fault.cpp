// SPDX-License-Identifier: Apache-2.0
#include "simulator/faults/Fault.h"

#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <string_view>
#include <thread>

namespace pemaro::simulator {
namespace {

constexpr std::string_view kOperations[] = {
        "registerClient",
        "unregisterClient",
        "open",
        "getCblk",
        "prepareRecord",
        "startRecord",
        "stopRecord",
        "setRecordParameter",
        "setRecordFile",
        "sendEvent",
        "close",
        "reloadConfig",
        "saveConfig",
        "getConfigParams",
        "setConfigParams",
        "getProperties",
        "sendCommand",
        "setAFEParams",
        "getAFEParams",
        "getPacketSize",
        "inspect",
        "saveSession",
        "restoreSession",
        "setAuth",
        "touch.subscribe",
        "touch.unsubscribe",
        "touch.isSupported",
        "touch.isEnabled",
        "touch.enable",
        "touch.disable",
        "touch.configure_vm_region",
        "gesture.subscribe",
        "gesture.unsubscribe",
        "gesture.enableWakeup",
        "gesture.disableWakeup",
        "gesture.startGestureDetection",
        "gesture.stopGestureDetection",
        "gesture.addGesture",
        "gesture.deleteGesture",
        "gesture.enableGesture",
        "gesture.disableGesture",
        "gesture.improveGestureTraining",
        "gesture.getMaxPreDefinedGesture",
        "gesture.getMaxUserDefinedGesture",
        "hand.subscribe",
        "hand.unsubscribe",
        "hand.startEnrollment",
        "hand.stopEnrollment",
        "hand.scan",
        "hand.startMatching",
        "hand.stopMatching",
        "hand.cancelScan",
        "hand.setSecurity",
        "hand.setProfileName",
        "hand.deleteProfile",
        "hand.renameProfile",
        "hand.getMaxUser",
        "hand.getProfileList",
        "hand.enableWakeup",
        "hand.disableWakeup",
};

constexpr long kMaxDelayMs = 3600L * 1000;

/// False when `name` names no operation of any service.
bool readOperation(const std::string& name, Fault* fault) {
    if (std::find(std::begin(kOperations), std::end(kOperations), name) == std::end(kOperations)) {
        return false;
    }
    const size_t dot = name.find('.');
    const bool isManager = dot != std::string::npos;
    fault->service = isManager ? *serviceKindOf(name.substr(0, dot)) : ServiceKind::kCompanion;
    fault->operation = isManager ? name.substr(dot + 1) : name;
    return true;
}

bool parseStatus(const std::string& text, int* status) {
    char* end = nullptr;
    const long long number = strtoll(text.c_str(), &end, 0);
    if (text.empty() || *end != '\0' || number < std::numeric_limits<int32_t>::min() ||
        number > std::numeric_limits<uint32_t>::max()) {
        return false;
    }
    *status = static_cast<int>(static_cast<uint32_t>(number));
    return true;
}

bool parseDelay(const std::string& text, std::chrono::milliseconds* delay) {
    char* unit = nullptr;
    const long number = strtol(text.c_str(), &unit, 10);
    const std::string_view rest(unit);
    if (unit == text.c_str() || number < 0 || number > kMaxDelayMs) {
        return false;
    }
    if (rest == "ms") {
        *delay = std::chrono::milliseconds(number);
    } else if (rest == "s" && number <= kMaxDelayMs / 1000) {
        *delay = std::chrono::seconds(number);
    } else {
        return false;
    }
    return true;
}

/// The text behind `prefix`, if `text` begins with it.
std::optional<std::string> after(const std::string& text, const std::string& prefix) {
    return text.compare(0, prefix.size(), prefix) == 0 ? std::optional(text.substr(prefix.size()))
                                                       : std::nullopt;
}

}  // namespace

std::vector<std::string> Fault::operations() {
    return {std::begin(kOperations), std::end(kOperations)};
}

std::optional<Fault> Fault::parse(const std::string& text, std::string* problem) {
    const size_t equals = text.find('=');
    if (equals == std::string::npos) {
        *problem = "a fault is OPERATION=WHAT, not '" + text + "'";
        return std::nullopt;
    }
    Fault fault;
    const std::string name = text.substr(0, equals);
    const std::string what = text.substr(equals + 1);
    if (!readOperation(name, &fault)) {
        *problem = "the service has no operation '" + name + "'";
        return std::nullopt;
    }
    const bool isBlock = fault.operation == "getCblk";
    const auto status = after(what, "status:");
    const auto delay = after(what, "delay:");
    if (what == "die") {
        fault.kind = Kind::kDie;
    } else if (isBlock && what == "null") {
        fault.kind = Kind::kNull;
    } else if (!isBlock && status && parseStatus(*status, &fault.status)) {
        fault.kind = Kind::kStatus;
    } else if (delay && parseDelay(*delay, &fault.delay)) {
        fault.kind = Kind::kDelay;
    } else {
        *problem = "'" + what + "' is no fault of " + fault.operation + ": use " +
                   (isBlock ? "null" : "status:NUMBER") + ", delay:TIME (ms or s) or die";
        return std::nullopt;
    }
    return fault;
}

void FaultTable::add(const Fault& fault) {
    std::lock_guard<std::mutex> guard(mLock);
    mFaults[fault.operation].push_back(fault);
}

void FaultTable::clear() {
    std::lock_guard<std::mutex> guard(mLock);
    mFaults.clear();
}

std::optional<int> FaultTable::strike(const char* operation) {
    std::vector<Fault> faults;
    {
        std::lock_guard<std::mutex> guard(mLock);
        const auto found = mFaults.find(operation);
        if (found == mFaults.end()) {
            return std::nullopt;
        }
        faults = found->second;
    }
    std::optional<int> result;
    for (const Fault& fault : faults) {
        switch (fault.kind) {
            case Fault::Kind::kDelay:
                std::this_thread::sleep_for(fault.delay);
                break;
            case Fault::Kind::kDie:
                fprintf(stderr, "zelk-touchstack: dies at %s, as ordered\n", operation);
                _exit(kDeathStatus);
            case Fault::Kind::kNull:
                result = 0;
                break;
            case Fault::Kind::kStatus:
                result = fault.status;
                break;
        }
    }
    return result;
}

}  // namespace pemaro::simulator
