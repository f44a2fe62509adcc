// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "pemaro/BnGestureManagerClient.h"
#include "pemaro/BnGestureManagerService.h"
#include "pemaro/BnHandBiometricManagerClient.h"
#include "pemaro/BnHandBiometricManagerService.h"
#include "pemaro/BnTouchManagerClient.h"
#include "pemaro/BnTouchManagerService.h"
#include "pemaro/Status.h"
#include "tests/managers/ManagerParcels.h"

namespace pemaro::test {

// The implementations behind the managers' stubs: each call is recorded as a text, and answered with
// what the test has set. They are written by hand because mocks made with gmock, and what expects
// calls of them, take longer to compile than all else in these tests.

/// What an implementation was called with, and what it answers.
struct Recording {
    using Calls = std::vector<std::string>;
    using Addresses = std::vector<const void*>;

    /// Each call as the operation and its arguments: "enable(9)", "setProfileName('alice')",
    /// "subscribe(object)", "addGesture(3, 3 records)"; a null pointer is "null". The place of an
    /// answer is not told, but what a list holds that is to be filled.
    Calls calls;

    /// Where the records and names lie that the calls were given, in order, null or not.
    Addresses addresses;

    /// What each call returns.
    int status = STATUS_NO_ERROR;

    /// What an operation leaves that answers a flag or a number, ...
    int64_t number = 0;

    /// ... and one that answers names.
    std::vector<std::string> names;

  protected:
    int called(const char* operation, const std::vector<std::string>& arguments = {}) {
        std::string call = std::string(operation) + "(";
        const char* separator = "";
        for (const std::string& argument : arguments) {
            call += separator + argument;
            separator = ", ";
        }
        calls.push_back(call + ")");
        return status;
    }

    /// The answer is left before the call returns.
    template <typename Value>
    int calledForNumber(const char* operation, const std::vector<std::string>& arguments,
                        Value& value) {
        value = static_cast<Value>(number);
        return called(operation, arguments);
    }

    static std::string text(int value) { return std::to_string(value); }

    static std::string text(bool value) { return value ? "true" : "false"; }

    std::string text(const char* name) {
        addresses.push_back(name);
        return name == nullptr ? "null" : "'" + std::string(name) + "'";
    }

    /// Records are told from others by the bytes that makeRecords() gives them; a count that no test
    /// sends that many for is not believed.
    template <typename Record>
    std::string text(const Record* records, int count) {
        addresses.push_back(records);
        if (records == nullptr) {
            return "null";
        }
        const bool known = count >= 0 && count < 8 && holdsRecords(records, count);
        return known ? std::to_string(count) + (count == 1 ? " record" : " records")
                     : "other bytes";
    }
};

/// A service, and who subscribed and unsubscribed, in order.
template <typename Bn, typename Client>
class RecordingService : public Bn, public Recording {
  public:
    int subscribe(const android::sp<Client>& client) override {
        return calledWith("subscribe", client);
    }
    int unsubscribe(const android::sp<Client>& client) override {
        return calledWith("unsubscribe", client);
    }

    std::vector<android::sp<Client>> clients;

  private:
    int calledWith(const char* operation, const android::sp<Client>& client) {
        clients.push_back(client);
        return called(operation, {client == nullptr ? "null" : "object"});
    }
};

class RecordingTouchManagerService
        : public RecordingService<BnTouchManagerService, ITouchManagerClient> {
  public:
    int isSupported(int feature, bool& supported) override {
        return calledForNumber("isSupported", {text(feature)}, supported);
    }
    int isEnabled(int feature, bool& enabled) override {
        return calledForNumber("isEnabled", {text(feature)}, enabled);
    }
    int enable(int feature) override { return called("enable", {text(feature)}); }
    int disable(int feature) override { return called("disable", {text(feature)}); }
    int configure_vm_region(android::Rect& region, bool flag) override {
        return called("configure_vm_region", {text(region.left), text(region.top),
                                              text(region.right), text(region.bottom), text(flag)});
    }
};

class RecordingTouchManagerClient : public BnTouchManagerClient, public Recording {
  public:
    int gestureCallback(GestureData* gesture) override {
        return called("gestureCallback", {text(gesture, 1)});
    }
};

class RecordingGestureManagerService
        : public RecordingService<BnGestureManagerService, IGestureManagerClient> {
  public:
    using Gesture = IGestureManagerClient::GestureData;

    int enableWakeup() override { return called("enableWakeup"); }
    int disableWakeup() override { return called("disableWakeup"); }
    int startGestureDetection() override { return called("startGestureDetection"); }
    int stopGestureDetection() override { return called("stopGestureDetection"); }
    int addGesture(int count, Gesture* samples, int& result) override {
        return calledForNumber("addGesture", {text(count), text(samples, count)}, result);
    }
    int deleteGesture(int gesture) override { return called("deleteGesture", {text(gesture)}); }
    int enableGesture(int gesture) override { return called("enableGesture", {text(gesture)}); }
    int disableGesture(int gesture) override { return called("disableGesture", {text(gesture)}); }
    int improveGestureTraining(Gesture* sample, int& result) override {
        return calledForNumber("improveGestureTraining", {text(sample, 1)}, result);
    }
    int getMaxPreDefinedGesture(unsigned int& most) override {
        return calledForNumber("getMaxPreDefinedGesture", {}, most);
    }
    int getMaxUserDefinedGesture(unsigned int& most) override {
        return calledForNumber("getMaxUserDefinedGesture", {}, most);
    }
};

class RecordingGestureManagerClient : public BnGestureManagerClient, public Recording {
  public:
    int gestureCallback(GestureData* gesture) override {
        return called("gestureCallback", {text(gesture, 1)});
    }
};

class RecordingHandBiometricManagerService
        : public RecordingService<BnHandBiometricManagerService, IHandBiometricManagerClient> {
  public:
    int startEnrollment() override { return called("startEnrollment"); }
    int stopEnrollment() override { return called("stopEnrollment"); }
    int scan() override { return called("scan"); }
    int startMatching() override { return called("startMatching"); }
    int stopMatching() override { return called("stopMatching"); }
    int cancelScan() override { return called("cancelScan"); }
    int setSecurity(int level) override { return called("setSecurity", {text(level)}); }
    int setProfileName(const char* name) override { return called("setProfileName", {text(name)}); }
    int deleteProfile(const char* name) override { return called("deleteProfile", {text(name)}); }
    int renameProfile(const char* from, const char* to) override {
        return called("renameProfile", {text(from), text(to)});
    }
    int getMaxUser(unsigned int& most) override { return calledForNumber("getMaxUser", {}, most); }
    int getProfileList(std::vector<std::string>& list) override {
        const std::vector<std::string> given = list;
        list = names;
        return called("getProfileList", given);
    }
    int enableWakeup() override { return called("enableWakeup"); }
    int disableWakeup() override { return called("disableWakeup"); }
};

class RecordingHandBiometricManagerClient : public BnHandBiometricManagerClient, public Recording {
  public:
    int handBiometricCallback(HandBioData* event) override {
        return called("handBiometricCallback", {text(event, 1)});
    }
};

}  // namespace pemaro::test
