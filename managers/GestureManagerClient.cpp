// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "GestureManagerClient"

#include "pemaro/GestureManagerClient.h"

#include <log/log.h>

#include "binder/ServiceCall.h"
#include "managers/ManagerConnection.h"
#include "pemaro/Status.h"

namespace pemaro {

using android::IBinder;
using android::wp;

namespace {

constexpr ManagerTexts kTexts = {LOG_TAG, "pemaro.GestureManagerService", "Init successful: X",
                                 "failed to link to gesture manager service death"};

using Connection = ManagerConnection<IGestureManagerService, IGestureManagerClient>;
using Service = IGestureManagerService;

}  // namespace

GestureManagerClient::GestureManagerClient() : GestureManagerClient(nullptr, nullptr, nullptr) {}

GestureManagerClient::GestureManagerClient(GestureCallback gestureCb, DeathCallback deathCb,
                                           void* ctx)
        : mGestureCallback(gestureCb), mDeathCallback(deathCb), mContext(ctx) {}

GestureManagerClient::~GestureManagerClient() {
    ALOGD("~GestureManagerClient: E");
    if (mInitialized) {
        mService.clear();
    }
    ALOGD("~GestureManagerClient(): X");
}

int GestureManagerClient::init() {
    return Connection(kTexts, mInitialized, mService, this).initWatched(this);
}

int GestureManagerClient::deinit() {
    return Connection(kTexts, mInitialized, mService, this).deinit(this);
}

// The wake-up and detection operations share two texts, and stopGestureDetection fails with the one
// of enabling. Log readers know them so; they stay.

int GestureManagerClient::enableWakeup() {
    return callService({LOG_TAG, "enable failed: %s"}, mService, &Service::enableWakeup);
}

int GestureManagerClient::disableWakeup() {
    return callService({LOG_TAG, "disable failed: %s"}, mService, &Service::disableWakeup);
}

int GestureManagerClient::startGestureDetection() {
    return callService({LOG_TAG, "enable failed: %s"}, mService, &Service::startGestureDetection);
}

int GestureManagerClient::stopGestureDetection() {
    return callService({LOG_TAG, "enable failed: %s"}, mService, &Service::stopGestureDetection);
}

int GestureManagerClient::addGesture(int count, IGestureManagerClient::GestureData* samples,
                                     int& result) {
    return callService({LOG_TAG, "addGesture failed: %s"}, mService, &Service::addGesture, count,
                       samples, result);
}

int GestureManagerClient::deleteGesture(int gesture) {
    return callService({LOG_TAG, "deleteGesture failed: %s"}, mService, &Service::deleteGesture,
                       gesture);
}

int GestureManagerClient::enableGesture(int gesture) {
    return callService({LOG_TAG, "enableGesture failed: %s"}, mService, &Service::enableGesture,
                       gesture);
}

int GestureManagerClient::disableGesture(int gesture) {
    return callService({LOG_TAG, "disableGesture failed: %s"}, mService, &Service::disableGesture,
                       gesture);
}

int GestureManagerClient::verifyGesture(IGestureManagerClient::GestureData* sample, int& result) {
    return callService({LOG_TAG, "improveGestureTraining failed: %s"}, mService,
                       &Service::improveGestureTraining, sample, result);
}

int GestureManagerClient::getMaxPreDefinedGesture(unsigned int& count) {
    return callService({LOG_TAG, "getMaxPreDefinedGesture failed: %s"}, mService,
                       &Service::getMaxPreDefinedGesture, count);
}

int GestureManagerClient::getMaxUserDefinedGesture(unsigned int& count) {
    return callService({LOG_TAG, "getMaxUserDefinedGesture failed: %s"}, mService,
                       &Service::getMaxUserDefinedGesture, count);
}

int GestureManagerClient::gestureCallback(IGestureManagerClient::GestureData* data) {
    Connection connection(kTexts, mInitialized, mService, this);
    ALOGE("Gesture event detected (client address = %p)", this);
    if (connection.accepts(mGestureCallback, mContext, "callback is null")) {
        mGestureCallback(data, mContext);
    }
    return STATUS_NO_ERROR;
}

void GestureManagerClient::binderDied(const wp<IBinder>&) {
    Connection connection(kTexts, mInitialized, mService, this);
    ALOGE("Gesture Manager Service died!");
    if (connection.accepts(mDeathCallback, mContext, "callback is null")) {
        mDeathCallback(mContext);
    }
}

}  // namespace pemaro
