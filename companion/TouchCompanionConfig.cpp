// SPDX-License-Identifier: Apache-2.0
// TouchCompanionClient's configuration, events, sessions and authentication: each hands one call to
// the service and passes its status on.

#define LOG_TAG "TouchCompanionClient"

#include <log/log.h>

#include "companion/ClientFailure.h"
#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"

namespace pemaro {

using Service = ITouchCompanionService;

int TouchCompanionClient::sendEvent(eventType type, eventParam param) {
    return callService(clientFailure("sendEvent failed"), mService, &Service::sendEvent,
                       static_cast<int>(type), static_cast<int>(param));
}

int TouchCompanionClient::reloadConfig(const std::string* path) {
    return callService(clientFailure("reloadConfig failed"), mService, &Service::reloadConfig,
                       path);
}

int TouchCompanionClient::saveConfig(const std::string* path) {
    return callService(clientFailure("saveConfig failed"), mService, &Service::saveConfig, path);
}

int TouchCompanionClient::setConfigParams(const void* data, size_t size) {
    return callService(clientFailure("setConfigParams (binary) failed"), mService,
                       &Service::setConfigParams, data, size);
}

int TouchCompanionClient::getConfigParams(void* buffer, size_t* len) {
    if (len == nullptr) {
        ALOGE("Error: len cannot be null!");
        return STATUS_NULL_POINTER;
    }
    return callService(kUnloggedFailure, mService, [&](Service& service) {
        const size_t length = service.getConfigParams(buffer, *len);
        if (length == 0) {
            ALOGE("getConfigParams (binary) failed");
            return STATUS_UNKNOWN_ERROR;
        }
        if (*len != 0 && length > *len) {
            ALOGE("something went wrong! returned len should not be larger than expected len.");
            return STATUS_UNKNOWN_ERROR;
        }
        *len = length;
        return STATUS_NO_ERROR;
    });
}

int TouchCompanionClient::getConfigParams(SerializableMap& params) {
    // Nothing is asked for, so nothing can fail: not even the lack of a service.
    if (params.size() == 0) {
        ALOGD("params map is empty...no config values were retrieved");
        return STATUS_NO_ERROR;
    }
    return callService(kUnloggedFailure, mService,
                       [&](Service& service) { return service.getConfigParams(params); });
}

int TouchCompanionClient::getPacketSize() {
    return callService(kUnloggedFailure, mService, &Service::getPacketSize);
}

int TouchCompanionClient::inspect(unsigned int* value) {
    return callService(kUnloggedFailure, mService, &Service::inspect, value);
}

int TouchCompanionClient::saveSession(int& sessionID) {
    ALOGD("saveSession E %d", sessionID);
    int status = callService(kUnloggedFailure, mService, &Service::saveSession, sessionID);
    ALOGD("saveSession X= %d", status);
    return status;
}

int TouchCompanionClient::restoreSession(int sessionID) {
    ALOGD("restoreSession E %d", sessionID);
    int status = callService(kUnloggedFailure, mService, &Service::restoreSession, sessionID);
    ALOGD("restoreSession X= %d", status);
    return status;
}

int TouchCompanionClient::setAuth(const char* auth) {
    return callService(clientFailure("setAuth failed"), mService,
                       [&](Service& service) { return service.setAuth(std::string(auth)); });
}

}  // namespace pemaro
