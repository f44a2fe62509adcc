// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/Device.h"

#include "pemaro/Status.h"

namespace pemaro::simulator {
namespace {

constexpr int kAfeChannels = 4;
constexpr int kMaxRollingLogSize = 65536;
constexpr size_t kMaxSessions = 32;

}  // namespace

Device::Settings Device::factorySettings() {
    Settings settings;
    settings.afe.add("drive.voltage", 3.3f);
    settings.afe.add("frequency", 250000);
    settings.afe.add("integration.cycles", 16);
    return settings;
}

Device::Device(const std::string& authText)
        : mAuthText(authText),
          mFilter(std::make_shared<std::atomic<uint32_t>>(frames::kFilterDefault)),
          mSettings(factorySettings()) {}

int Device::resetToFactory() {
    if (!mAuthenticated) {
        return STATUS_INVALID_STATE;
    }
    mSettings = factorySettings();
    setFilter(mSettings.filter);
    return STATUS_NO_ERROR;
}

int Device::setAfe(const SerializableMap& params) {
    SerializableMap given = params;
    for (size_t i = 0; i < given.size(); ++i) {
        std::string key;
        given.keyAt(i, key);
        if (mSettings.afe.indexOfKey(key) < 0) {
            return STATUS_BAD_PARAMETER;
        }
    }
    mSettings.afe += given;
    return STATUS_NO_ERROR;
}

SerializableMapArray Device::afeChannels() const {
    SerializableMapArray channels;
    for (int channel = 0; channel < kAfeChannels; ++channel) {
        SerializableMap params = mSettings.afe;
        params.add("channel", channel);
        channels.add(params);
    }
    return channels;
}

int Device::setRollingLogSize(int kilobytes) {
    if (kilobytes < 0 || kilobytes > kMaxRollingLogSize) {
        return STATUS_BAD_PARAMETER;
    }
    mRollingLogSize = kilobytes;
    return STATUS_NO_ERROR;
}

SerializableMap Device::properties() const {
    SerializableMap properties;
    properties.add("authenticated", mAuthenticated);
    properties.add("events", mEvents);
    properties.add("recordFilter", filter());
    properties.add("rollingLogSize", mRollingLogSize);
    properties.add("sessions", static_cast<int>(mSessions.size()));
    return properties;
}

int Device::saveSession() {
    const int id = mSessions.empty() ? 1 : mSessions.rbegin()->first + 1;
    mSessions[id] = mSettings;
    mSessions[id].filter = filter();
    if (mSessions.size() > kMaxSessions) {
        mSessions.erase(mSessions.begin());
    }
    return id;
}

int Device::restoreSession(int id) {
    const auto found = mSessions.find(id);
    if (found == mSessions.end()) {
        return STATUS_NOT_FOUND;
    }
    mSettings = found->second;
    setFilter(mSettings.filter);
    return STATUS_NO_ERROR;
}

std::vector<std::string> Device::sessions() const {
    std::vector<std::string> sessions;
    for (const auto& [id, settings] : mSessions) {
        sessions.push_back(std::to_string(id));
    }
    return sessions;
}

int Device::authenticate(const std::string& text) {
    mAuthenticated = text == mAuthText;
    return mAuthenticated ? STATUS_NO_ERROR : STATUS_BAD_PARAMETER;
}

}  // namespace pemaro::simulator
