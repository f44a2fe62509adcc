// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gmock/gmock.h>

#include <string>
#include <vector>

#include "pemaro/BnGestureManagerClient.h"
#include "pemaro/BnGestureManagerService.h"
#include "pemaro/BnHandBiometricManagerClient.h"
#include "pemaro/BnHandBiometricManagerService.h"
#include "pemaro/BnTouchManagerClient.h"
#include "pemaro/BnTouchManagerService.h"

namespace pemaro::test {

// The implementations behind the managers' stubs. They are reference-counted, and their
// expectations are verified when the last reference goes.

class MockTouchManagerService : public BnTouchManagerService {
  public:
    MOCK_METHOD(int, subscribe, (const android::sp<ITouchManagerClient>&), (override));
    MOCK_METHOD(int, unsubscribe, (const android::sp<ITouchManagerClient>&), (override));
    MOCK_METHOD(int, isSupported, (int, bool&), (override));
    MOCK_METHOD(int, isEnabled, (int, bool&), (override));
    MOCK_METHOD(int, enable, (int), (override));
    MOCK_METHOD(int, disable, (int), (override));
    MOCK_METHOD(int, configure_vm_region, (android::Rect&, bool), (override));
};

class MockTouchManagerClient : public BnTouchManagerClient {
  public:
    MOCK_METHOD(int, gestureCallback, (GestureData*), (override));
};

class MockGestureManagerService : public BnGestureManagerService {
  public:
    using Gesture = IGestureManagerClient::GestureData;

    MOCK_METHOD(int, subscribe, (const android::sp<IGestureManagerClient>&), (override));
    MOCK_METHOD(int, unsubscribe, (const android::sp<IGestureManagerClient>&), (override));
    MOCK_METHOD(int, enableWakeup, (), (override));
    MOCK_METHOD(int, disableWakeup, (), (override));
    MOCK_METHOD(int, startGestureDetection, (), (override));
    MOCK_METHOD(int, stopGestureDetection, (), (override));
    MOCK_METHOD(int, addGesture, (int, Gesture*, int&), (override));
    MOCK_METHOD(int, deleteGesture, (int), (override));
    MOCK_METHOD(int, enableGesture, (int), (override));
    MOCK_METHOD(int, disableGesture, (int), (override));
    MOCK_METHOD(int, improveGestureTraining, (Gesture*, int&), (override));
    MOCK_METHOD(int, getMaxPreDefinedGesture, (unsigned int&), (override));
    MOCK_METHOD(int, getMaxUserDefinedGesture, (unsigned int&), (override));
};

class MockGestureManagerClient : public BnGestureManagerClient {
  public:
    MOCK_METHOD(int, gestureCallback, (GestureData*), (override));
};

class MockHandBiometricManagerService : public BnHandBiometricManagerService {
  public:
    MOCK_METHOD(int, subscribe, (const android::sp<IHandBiometricManagerClient>&), (override));
    MOCK_METHOD(int, unsubscribe, (const android::sp<IHandBiometricManagerClient>&), (override));
    MOCK_METHOD(int, startEnrollment, (), (override));
    MOCK_METHOD(int, stopEnrollment, (), (override));
    MOCK_METHOD(int, scan, (), (override));
    MOCK_METHOD(int, startMatching, (), (override));
    MOCK_METHOD(int, stopMatching, (), (override));
    MOCK_METHOD(int, cancelScan, (), (override));
    MOCK_METHOD(int, setSecurity, (int), (override));
    MOCK_METHOD(int, setProfileName, (const char*), (override));
    MOCK_METHOD(int, deleteProfile, (const char*), (override));
    MOCK_METHOD(int, renameProfile, (const char*, const char*), (override));
    MOCK_METHOD(int, getMaxUser, (unsigned int&), (override));
    MOCK_METHOD(int, getProfileList, (std::vector<std::string>&), (override));
    MOCK_METHOD(int, enableWakeup, (), (override));
    MOCK_METHOD(int, disableWakeup, (), (override));
};

class MockHandBiometricManagerClient : public BnHandBiometricManagerClient {
  public:
    MOCK_METHOD(int, handBiometricCallback, (HandBioData*), (override));
};

}  // namespace pemaro::test
