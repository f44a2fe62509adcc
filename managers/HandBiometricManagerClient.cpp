// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "HandBiometricManagerClient"

#include "pemaro/HandBiometricManagerClient.h"

#include <log/log.h>

#include "binder/ServiceCall.h"
#include "managers/ManagerConnection.h"
#include "pemaro/Status.h"

namespace pemaro {

using android::IBinder;
using android::wp;

namespace {

constexpr ManagerTexts kTexts = {LOG_TAG, "pemaro.HandBiometricManagerService", "Init successful",
                                 "failed to link to HB manager service death"};

using Connection = ManagerConnection<IHandBiometricManagerService, IHandBiometricManagerClient>;
using Service = IHandBiometricManagerService;

}  // namespace

HandBiometricManagerClient::HandBiometricManagerClient()
        : HandBiometricManagerClient(nullptr, nullptr, nullptr) {}

HandBiometricManagerClient::HandBiometricManagerClient(EventCallback eventCb, DeathCallback deathCb,
                                                       void* ctx)
        : mEventCallback(eventCb), mDeathCallback(deathCb), mContext(ctx) {}

HandBiometricManagerClient::~HandBiometricManagerClient() {
    ALOGD("~HandBiometricManagerClient: E: this = %p", this);
    if (mInitialized) {
        mService.clear();
    }
    ALOGD("~HandBiometricManagerClient(): X");
}

int HandBiometricManagerClient::init() {
    return Connection(kTexts, mInitialized, mService, this).initWatched(this);
}

int HandBiometricManagerClient::deinit() {
    return Connection(kTexts, mInitialized, mService, this).deinit(this);
}

// The operations on profile names share setProfileName's text. Log readers know it so; it stays.

int HandBiometricManagerClient::startEnrollment() {
    return callService({LOG_TAG, "startEnrollment failed: %s"}, mService,
                       &Service::startEnrollment);
}

int HandBiometricManagerClient::stopEnrollment() {
    return callService({LOG_TAG, "stopEnrollment failed: %s"}, mService, &Service::stopEnrollment);
}

int HandBiometricManagerClient::scan() {
    return callService({LOG_TAG, "scan failed: %s"}, mService, &Service::scan);
}

int HandBiometricManagerClient::startMatching() {
    return callService({LOG_TAG, "startMatching failed: %s"}, mService, &Service::startMatching);
}

int HandBiometricManagerClient::stopMatching() {
    return callService({LOG_TAG, "stopMatching failed: %s"}, mService, &Service::stopMatching);
}

int HandBiometricManagerClient::cancelScan() {
    return callService({LOG_TAG, "cancelScan failed: %s"}, mService, &Service::cancelScan);
}

int HandBiometricManagerClient::setSecurity(int level) {
    return callService({LOG_TAG, "setSecurity failed: %s"}, mService, &Service::setSecurity, level);
}

int HandBiometricManagerClient::setProfileName(const char* name) {
    return callService({LOG_TAG, "setProfileName failed: %s"}, mService, &Service::setProfileName,
                       name);
}

int HandBiometricManagerClient::deleteProfile(const char* name) {
    return callService({LOG_TAG, "setProfileName failed: %s"}, mService, &Service::deleteProfile,
                       name);
}

int HandBiometricManagerClient::renameProfile(const char* first, const char* second) {
    return callService({LOG_TAG, "setProfileName failed: %s"}, mService, &Service::renameProfile,
                       first, second);
}

int HandBiometricManagerClient::getMaxUser(unsigned int& count) {
    return callService({LOG_TAG, "getMaxUser failed: %s"}, mService, &Service::getMaxUser, count);
}

int HandBiometricManagerClient::getProfileList(std::vector<std::string>& names) {
    return callService({LOG_TAG, "getProfileList failed: %s"}, mService, &Service::getProfileList,
                       names);
}

int HandBiometricManagerClient::enableWakeup() {
    return callService({LOG_TAG, "enable failed: %s"}, mService, &Service::enableWakeup);
}

int HandBiometricManagerClient::disableWakeup() {
    return callService({LOG_TAG, "disable failed: %s"}, mService, &Service::disableWakeup);
}

int HandBiometricManagerClient::handBiometricCallback(
        IHandBiometricManagerClient::HandBioData* data) {
    Connection connection(kTexts, mInitialized, mService, this);
    ALOGE("handBiometricCallback: HandBiometric event detected");
    if (connection.accepts(mEventCallback, mContext, "handBiometricCallback is null")) {
        mEventCallback(data, mContext);
    }
    return STATUS_NO_ERROR;
}

void HandBiometricManagerClient::binderDied(const wp<IBinder>&) {
    Connection connection(kTexts, mInitialized, mService, this);
    ALOGE("HB Manager Service died!");
    if (connection.accepts(mDeathCallback, mContext, "callback is null")) {
        mDeathCallback(mContext);
    }
}

}  // namespace pemaro
