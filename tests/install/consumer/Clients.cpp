// SPDX-License-Identifier: Apache-2.0
// The clients, the facades and the factories, before any of them has connected.

#include <pemaro/zelkclient.h>

#include <memory>
#include <string>

#include "Check.h"

namespace {

using namespace pemaro;
using android::sp;

// Makes the program refer to each of these members, so that it links only if all are exported.
template <typename... Members>
void refersTo(Members... members) {
    const volatile bool present[] = {(members != nullptr)...};
    for (const volatile bool& one : present) {
        CHECK(one);
    }
}

void onFrame(int, void*, unsigned long, void*) {}
void onTouchGesture(ITouchManagerClient::GestureData*, void*) {}
void onGesture(IGestureManagerClient::GestureData*, void*) {}
void onHand(IHandBiometricManagerClient::HandBioData*, void*) {}
void onDeath(void*) {}

void useTouchCompanionClient() {
    using C = TouchCompanionClient;
    const sp<C> client = new C(onFrame, nullptr);
    const sp<C> plain = new C;
    CHECK(client->pingService() == 0);
    CHECK(client->setRecordOutput(1) == STATUS_INVALID_STATE);
    CHECK(client->startRecord() == STATUS_INVALID_STATE);
    CHECK(client->read(nullptr, 0) == 0);
    SerializableMap empty;
    CHECK(client->getConfigParams(empty) == 0);
    SerializableMapArray values;
    int count = 0;
    char numbers[] = "1 2";
    CHECK(client->getToolCmdValue(numbers, values, count) == 0 && count == 2);
    const sp<BnTouchCompanionClient> handle = new C::BinderHandle;

    refersTo(&C::init, &C::setRecordFile, &C::stopRecord, &C::processData, &C::acquireBuffer,
             &C::releaseBuffer, &C::setRecordFilter, &C::setProperty, &C::sendEvent,
             &C::reloadConfig, &C::saveConfig, &C::setConfigParams, &C::getPacketSize, &C::inspect,
             &C::saveSession, &C::restoreSession, &C::setAuth);
    refersTo(static_cast<int (C::*)(const char*, char**)>(&C::sendCommand),
             static_cast<int (C::*)(SerializableMap&, SerializableMap&)>(&C::sendCommand),
             static_cast<int (C::*)(void*, size_t*)>(&C::getConfigParams),
             static_cast<int (C::*)(char*, int&)>(&C::getToolCmdValue),
             static_cast<int (C::*)(SerializableMap&, int&, std::string)>(
                     &C::getResultFromResponseCmd),
             static_cast<int (C::*)(SerializableMap&, SerializableMap&, std::string)>(
                     &C::getResultFromResponseCmd),
             static_cast<int (C::*)(SerializableMap&, SerializableMapArray&, std::string)>(
                     &C::getResultFromResponseCmd));
}

void useManagerClients() {
    using Touch = TouchManagerClient;
    using Gesture = GestureManagerClient;
    using Hand = HandBiometricManagerClient;
    const sp<Touch> touch = new Touch;
    const sp<Gesture> gesture = new Gesture;
    const sp<Hand> hand = new Hand;
    CHECK(touch != nullptr && gesture != nullptr && hand != nullptr);

    refersTo(&Touch::init, &Touch::deinit, &Touch::isSupported, &Touch::isEnabled, &Touch::enable,
             &Touch::disable, &Touch::configure_vm_region);
    refersTo(&Gesture::init, &Gesture::deinit, &Gesture::enableWakeup, &Gesture::disableWakeup,
             &Gesture::startGestureDetection, &Gesture::stopGestureDetection, &Gesture::addGesture,
             &Gesture::deleteGesture, &Gesture::enableGesture, &Gesture::disableGesture,
             &Gesture::verifyGesture, &Gesture::getMaxPreDefinedGesture,
             &Gesture::getMaxUserDefinedGesture);
    refersTo(&Hand::init, &Hand::deinit, &Hand::startEnrollment, &Hand::stopEnrollment, &Hand::scan,
             &Hand::startMatching, &Hand::stopMatching, &Hand::cancelScan, &Hand::setSecurity,
             &Hand::setProfileName, &Hand::deleteProfile, &Hand::renameProfile, &Hand::getMaxUser,
             &Hand::getProfileList, &Hand::enableWakeup, &Hand::disableWakeup);
}

void useManagerFactories() {
    TouchManagerClient* touch = nullptr;
    CHECK(VEXPemaroTouchManagerClientCreateInstance(&touch, onTouchGesture, nullptr) == 0);
    GestureManagerClient* gesture = nullptr;
    CHECK(VEXPemaroGestureManagerClientCreateInstance(&gesture, onGesture, onDeath, nullptr) == 0);
    HandBiometricManagerClient* hand = nullptr;
    CHECK(VEXPemaroHandBiometricManagerClientCreateInstance(&hand, onHand, onDeath, nullptr) == 0);
    const sp<TouchManagerClient> ownedTouch = touch;
    const sp<GestureManagerClient> ownedGesture = gesture;
    const sp<HandBiometricManagerClient> ownedHand = hand;
    CHECK(ownedTouch != nullptr && ownedGesture != nullptr && ownedHand != nullptr);
}

template <typename Interface>
std::unique_ptr<Interface> make(int classID, decltype(&VEXPemaroCreateInstance) create) {
    void* instance = nullptr;
    CHECK(create(classID, classID << 16, &instance) == 0);
    std::unique_ptr<Interface> object(static_cast<Interface*>(instance));
    CHECK(object->getClassID() == classID);
    return object;
}

void useTouchCompanionFactory() {
    for (const auto create : {VEXPemaroCreateInstance, DURAPemaroCreateInstance}) {
        const auto params = make<ISerializableParams4>(4, create);
        std::string key = "gain";
        std::string value = "3";
        CHECK(params->setValue(key, value) == 0 && params->size() == 1);
        CHECK(params->getValue("gain", value) == 0 && value == "3");
        const auto older = make<ISerializableParams3>(3, create);
        CHECK(older->setParam(key, value) == 0 && older->size() == 1);
        const auto facade = make<ITouchCompanionFacade>(2048, create);
        CHECK(facade->setConfigParams(params.get()) == STATUS_UNSUPPORTED);
        const auto olderFacade = make<ITouchCompanionFacadeOld>(1792, create);
        CHECK(olderFacade->getFormatDescription(key, value) == STATUS_UNSUPPORTED);
        void* instance = nullptr;
        CHECK(create(5, 0x50000, &instance) == STATUS_BAD_PARAMETER && instance == nullptr);
    }
}

void useSharedBlock() {
    const auto block = std::make_unique<TouchCompanionSharedCblk>();
    CHECK(block->read == 0 && block->write == 0 && block->bufferFrames == 0);
}

}  // namespace

void useClients() {
    useTouchCompanionClient();
    useManagerClients();
    useManagerFactories();
    useTouchCompanionFactory();
    useSharedBlock();
}
