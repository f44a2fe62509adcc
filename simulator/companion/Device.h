// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <atomic>
#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "frames/Frame.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "simulator/companion/Configuration.h"

namespace pemaro::simulator {

/// The state of the simulated device that all clients share: configuration, analog front end, record
/// filter, properties, events, sessions, authentication. Not synchronised. Operations return a
/// status of Status.h and change nothing when they fail.
class Device {
  public:
    /// `authText` is what authenticate() accepts.
    explicit Device(const std::string& authText);

    Configuration& configuration() { return mSettings.configuration; }
    const Configuration& configuration() const { return mSettings.configuration; }
    /// Back to what the device was made with; STATUS_INVALID_STATE without authentication.
    int resetToFactory();

    void setFilter(uint32_t filter) { *mFilter = filter; }
    uint32_t filter() const { return *mFilter; }
    /// The filter as running recordings see it.
    std::shared_ptr<const std::atomic<uint32_t>> sharedFilter() const { return mFilter; }

    int setAfe(const SerializableMap& params);
    SerializableMap afe() const { return mSettings.afe; }
    /// One map for each channel of the front end.
    SerializableMapArray afeChannels() const;

    int setRollingLogSize(int kilobytes);
    SerializableMap properties() const;

    void countEvent() { mEvents += 1; }
    uint32_t events() const { return mEvents; }

    /// Keeps the configuration, front end and filter of now under a new identifier, from 1.
    int saveSession();
    int restoreSession(int id);
    /// Their identifiers, the oldest first.
    std::vector<std::string> sessions() const;

    int authenticate(const std::string& text);
    bool isAuthenticated() const { return mAuthenticated; }

  private:
    struct Settings {
        Configuration configuration;
        SerializableMap afe;
        uint32_t filter = frames::kFilterDefault;
    };

    static Settings factorySettings();

    const std::string mAuthText;
    const std::shared_ptr<std::atomic<uint32_t>> mFilter;
    Settings mSettings;
    std::map<int, Settings> mSessions;
    int mRollingLogSize = 256;
    uint32_t mEvents = 0;
    bool mAuthenticated = false;
};

}  // namespace pemaro::simulator
