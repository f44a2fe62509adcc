// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/touch/TouchCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/services/MapText.h"
#include "tools/zelkctl/services/StackQuery.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

/// What is known of the stack, told line by line or as one object. Operations that fail are left
/// out: that one is not offered is nothing against the rest.
class Info {
  public:
    int collect() {
        const int exitStatus = startBinder();
        if (exitStatus != tools::kExitSuccess) {
            return exitStatus;
        }
        if (isThere(Connection::kService)) {
            tellCompanion();
        }
        tellManager<TouchManager>(&Info::tellTouch);
        tellManager<GestureManager>(&Info::tellGestures);
        tellManager<HandManager>(&Info::tellHands);
        if (mustStop()) {
            return failStopped();
        }
        mObject.add("services", mServices);
        sayResult(mText.substr(0, mText.size() - 1), mObject);
        return tools::kExitSuccess;
    }

  private:
    bool isThere(const char* service) {
        const bool there = !mustStop() && ServiceWatch::find(service) != nullptr;
        mText += fmt::format("{:40} {}\n", service, there ? "running" : "not running");
        mServices.addFlag(service, there);
        return there;
    }

    void tell(const std::string& name, const std::string& value) {
        mText += fmt::format("  {:18} {}\n", name, value);
        mObject.addParsed(name, value);
    }

    /// The entries of a map as members of their own, and each on a line.
    void tell(const std::string& name, SerializableMap& map) {
        JsonObject object;
        addEntries(object, map, keysOf(map));
        mObject.add(name, object);
        for (const std::string& key : keysOf(map)) {
            mText += fmt::format("  {:18} {}\n", name, linesOf(map, {key}));
        }
    }

    /// What no interface tells, as "name=value" lines of the simulated stack's own command.
    void tellState(const std::string& name, const std::string& command) {
        JsonObject object;
        bool isTold = false;
        for (const std::string& line : tryQueryStack(command)) {
            const size_t equals = line.find('=');
            if (equals == std::string::npos) {
                continue;
            }
            const std::string key = line.substr(0, equals);
            const std::string value = line.substr(equals + 1);
            if (value == "on" || value == "off") {
                object.addFlag(key, value == "on");
            } else {
                object.addParsed(key, value);
            }
            mText += fmt::format("  {:18} {}\n", name, printable(line));
            isTold = true;
        }
        if (isTold) {
            mObject.add(name, object);
        }
    }

    void tellCompanion() {
        const android::sp<TouchCompanionClient> client = new TouchCompanionClient();
        if (call("init", [&] { return client->init(); }) != STATUS_NO_ERROR) {
            return;
        }
        const int size = call("getPacketSize", [&] { return client->getPacketSize(); });
        if (size < STATUS_UNKNOWN_ERROR) {
            tell("packetSize", std::to_string(size));
        }
        int exitStatus = tools::kExitSuccess;
        const std::unique_ptr<Connection> connection = Connection::open(exitStatus);
        SerializableMap properties;
        if (connection != nullptr && call("getProperties", [&] {
                                         return connection->service()->getProperties(properties);
                                     }) == STATUS_NO_ERROR) {
            tell("properties", properties);
        }
        SerializableMap parameters;
        if (connection != nullptr && call("getAFEParams", [&] {
                                         return connection->service()->getAFEParams(parameters);
                                     }) == STATUS_NO_ERROR) {
            tell("frontEnd", parameters);
        }
        tellConfiguration(*client);
    }

    void tellConfiguration(TouchCompanionClient& client) {
        std::vector<std::string> keys;
        SerializableMap values;
        if (queryStack(client, "keys", keys) != STATUS_NO_ERROR) {
            return;
        }
        for (const std::string& key : keys) {
            values.add(key, std::string("?"));
        }
        if (call("getConfigParams", [&] { return client.getConfigParams(values); }) ==
            STATUS_NO_ERROR) {
            tell("configuration", values);
        }
    }

    template <typename Manager>
    void tellManager(void (Info::*tellAbout)(typename Manager::Client&)) {
        if (!isThere(Manager::kService)) {
            return;
        }
        const android::sp<typename Manager::Client> client = Manager::create(nullptr);
        if (call("init", [&] { return client->init(); }) == STATUS_NO_ERROR) {
            (this->*tellAbout)(*client);
            call("deinit", [&] { return client->deinit(); });
        }
    }

    void tellTouch(TouchManagerClient& client) {
        std::string features;
        for (const Feature& feature : supportedFeatures(client)) {
            features += fmt::format("{}{}{}", features.empty() ? "" : " ", feature.number,
                                    feature.enabled ? " (enabled)" : "");
            mFeatures.add(JsonObject()
                                  .add("feature", feature.number)
                                  .addFlag("enabled", feature.enabled));
        }
        mText += fmt::format("  {:18} {}\n", "features", features.empty() ? "none" : features);
        mObject.add("features", mFeatures);
    }

    void tellGestures(GestureManagerClient& client) {
        unsigned int count = 0;
        if (call("getMaxPreDefinedGesture",
                 [&] { return client.getMaxPreDefinedGesture(count); }) == STATUS_NO_ERROR) {
            tell("predefined", std::to_string(count));
        }
        if (call("getMaxUserDefinedGesture",
                 [&] { return client.getMaxUserDefinedGesture(count); }) == STATUS_NO_ERROR) {
            tell("userDefined", std::to_string(count));
        }
        tellState("gestures", "gesturestate");
    }

    void tellHands(HandBiometricManagerClient& client) {
        unsigned int most = 0;
        std::vector<std::string> names;
        if (call("getMaxUser", [&] { return client.getMaxUser(most); }) == STATUS_NO_ERROR &&
            call("getProfileList", [&] { return client.getProfileList(names); }) ==
                    STATUS_NO_ERROR) {
            tell("profiles", std::to_string(names.size()));
            tell("maxProfiles", std::to_string(most));
        }
        tellState("hands", "handstate");
    }

    std::string mText;
    JsonObject mObject;
    JsonObject mServices;
    JsonArray mFeatures;
};

}  // namespace

void addInfoCommand(CLI::App& app, Action& action) {
    Command(app, action, "info", "Tell what is running, and how it is set")
            .details("What a service does not tell is left out.")
            .runs([] { return Info().collect(); });
}

}  // namespace pemaro::zelkctl
