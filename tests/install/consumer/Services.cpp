// SPDX-License-Identifier: Apache-2.0
// The stubs, from which services and callbacks derive, and the proxies.

#include <pemaro/zelkclient.h>

#include "Check.h"

namespace {

using namespace pemaro;
using android::sp;

class TouchCompanionService : public BnTouchCompanionService {
  public:
    int registerClient(const sp<ITouchCompanionClient>&) override { return 0; }
    int unregisterClient() override { return 0; }
    int open() override { return 0; }
    sp<android::IMemory> getCblk() override { return nullptr; }
    int prepareRecord() override { return 0; }
    int startRecord() override { return 0; }
    int stopRecord() override { return 0; }
    int setRecordParameter(int) override { return 0; }
    int setRecordFile(const std::string&) override { return 0; }
    int sendEvent(int, int) override { return 0; }
    int close() override { return 0; }
    int reloadConfig(const std::string*) override { return 0; }
    int saveConfig(const std::string*) override { return 0; }
    size_t getConfigParams(void*, size_t) override { return 0; }
    int getConfigParams(SerializableMap&) override { return 0; }
    int setConfigParams(const void*, size_t) override { return 0; }
    int getProperties(SerializableMap&) override { return 0; }
    int sendCommand(SerializableMap&, SerializableMap&) override { return 0; }
    int setAFEParams(SerializableMap&) override { return 0; }
    int getAFEParams(SerializableMap&) override { return 0; }
    int getAFEParams(SerializableMapArray&) override { return 0; }
    int getPacketSize() override { return 512; }
    int inspect(unsigned int*) override { return 0; }
    int saveSession(int&) override { return 0; }
    int restoreSession(int) override { return 0; }
    int setAuth(const std::string&) override { return 0; }
};

class TouchCompanionCallback : public BnTouchCompanionClient {};

class TouchManagerService : public BnTouchManagerService {
  public:
    int subscribe(const sp<ITouchManagerClient>&) override { return 0; }
    int unsubscribe(const sp<ITouchManagerClient>&) override { return 0; }
    int isSupported(int, bool&) override { return 0; }
    int isEnabled(int, bool&) override { return 0; }
    int enable(int feature) override { return feature; }
    int disable(int) override { return 0; }
    int configure_vm_region(android::Rect&, bool) override { return 0; }
};

class TouchManagerCallback : public BnTouchManagerClient {
  public:
    int gestureCallback(GestureData*) override { return 0; }
};

class GestureManagerService : public BnGestureManagerService {
  public:
    int subscribe(const sp<IGestureManagerClient>&) override { return 0; }
    int unsubscribe(const sp<IGestureManagerClient>&) override { return 0; }
    int enableWakeup() override { return 0; }
    int disableWakeup() override { return 0; }
    int startGestureDetection() override { return 0; }
    int stopGestureDetection() override { return 0; }
    int addGesture(int, IGestureManagerClient::GestureData*, int&) override { return 0; }
    int deleteGesture(int gesture) override { return gesture; }
    int enableGesture(int) override { return 0; }
    int disableGesture(int) override { return 0; }
    int improveGestureTraining(IGestureManagerClient::GestureData*, int&) override { return 0; }
    int getMaxPreDefinedGesture(unsigned int&) override { return 0; }
    int getMaxUserDefinedGesture(unsigned int&) override { return 0; }
};

class GestureManagerCallback : public BnGestureManagerClient {
  public:
    int gestureCallback(GestureData*) override { return 0; }
};

class HandBiometricManagerService : public BnHandBiometricManagerService {
  public:
    int subscribe(const sp<IHandBiometricManagerClient>&) override { return 0; }
    int unsubscribe(const sp<IHandBiometricManagerClient>&) override { return 0; }
    int startEnrollment() override { return 0; }
    int stopEnrollment() override { return 0; }
    int scan() override { return 0; }
    int startMatching() override { return 0; }
    int stopMatching() override { return 0; }
    int cancelScan() override { return 0; }
    int setSecurity(int level) override { return level; }
    int setProfileName(const char*) override { return 0; }
    int deleteProfile(const char*) override { return 0; }
    int renameProfile(const char*, const char*) override { return 0; }
    int getMaxUser(unsigned int&) override { return 0; }
    int getProfileList(std::vector<std::string>&) override { return 0; }
    int enableWakeup() override { return 0; }
    int disableWakeup() override { return 0; }
};

class HandBiometricManagerCallback : public BnHandBiometricManagerClient {
  public:
    int handBiometricCallback(HandBioData*) override { return 0; }
};

// In its own process an object is its own interface; a proxy stands for one elsewhere.
template <typename Interface, typename Proxy, typename Object>
void useInterface() {
    const sp<Object> object = new Object;
    CHECK(Interface::asInterface(object) == static_cast<Interface*>(object.get()));
    CHECK(Interface::asInterface(nullptr) == nullptr);
    CHECK(object->getInterfaceDescriptor() == Interface::descriptor);
    const sp<android::BBinder> elsewhere = new android::BBinder;
    const sp<Interface> proxy = new Proxy(elsewhere);
    CHECK(android::IInterface::asBinder(proxy) == elsewhere);
}

}  // namespace

void useServices() {
    useInterface<ITouchCompanionService, BpTouchCompanionService, TouchCompanionService>();
    useInterface<ITouchCompanionClient, BpTouchCompanionClient, TouchCompanionCallback>();
    useInterface<ITouchManagerService, BpTouchManagerService, TouchManagerService>();
    useInterface<ITouchManagerClient, BpTouchManagerClient, TouchManagerCallback>();
    useInterface<IGestureManagerService, BpGestureManagerService, GestureManagerService>();
    useInterface<IGestureManagerClient, BpGestureManagerClient, GestureManagerCallback>();
    useInterface<IHandBiometricManagerService, BpHandBiometricManagerService,
                 HandBiometricManagerService>();
    useInterface<IHandBiometricManagerClient, BpHandBiometricManagerClient,
                 HandBiometricManagerCallback>();
}
