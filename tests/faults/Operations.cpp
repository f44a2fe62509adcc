// SPDX-License-Identifier: Apache-2.0
#include "tests/faults/Operations.h"

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ostream>
#include <utility>

#include "pemaro/Status.h"

namespace pemaro::test {

namespace {

using android::Parcel;
using android::Rect;
using Replies = std::function<ParcelWriter(int status)>;

constexpr char kCompanion[] = "TouchCompanionClient";
constexpr char kTouch[] = "TouchManagerClient";
constexpr char kGesture[] = "GestureManagerClient";
constexpr char kHand[] = "HandBiometricManagerClient";

// ---- replies ----

ParcelWriter statusAlone(int status) {
    return [status](Parcel& reply) { reply.writeInt32(status); };
}

Replies statusThenNumber(int number) {
    return [number](int status) -> ParcelWriter {
        return [=](Parcel& reply) {
            reply.writeInt32(status);
            reply.writeInt32(number);
        };
    };
}

Replies statusThenText(const std::string& text) {
    return [text](int status) -> ParcelWriter {
        return [=](Parcel& reply) {
            reply.writeInt32(status);
            writeString8(reply, text);
        };
    };
}

Replies numberThenStatus(int number) {
    return [number](int status) -> ParcelWriter {
        return [=](Parcel& reply) {
            reply.writeInt32(number);
            reply.writeInt32(status);
        };
    };
}

ParcelWriter twoNamesThenStatus(int status) {
    return [status](Parcel& reply) {
        reply.writeInt32(2);
        reply.writeCString("alice");
        reply.writeCString("barbara");
        reply.writeInt32(status);
    };
}

ParcelWriter configuration(int /* there is no status */) {
    return [](Parcel& reply) {
        reply.writeInt32(4);
        reply.write("abcd", 4);
    };
}

// ---- the tables ----

std::string textOf(const char* format, const char* reason) {
    char line[256];
    snprintf(line, sizeof(line), format, reason);
    return line;
}

Outcome plain(int status) {
    return {status, ""};
}

std::string number(int value) {
    return std::to_string(value);
}

// A command's answer in a response map.
constexpr char kAnswer[] =
        R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":{"OUT_STRING":"done","OUT_VALUE":4}}}})";
constexpr char kFilterAnswer[] = R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":5}}})";

// An empty reply reads as a status of 0.
const std::vector<ShortReply> kShortStatus = {{0, {0, ""}, {}}};

const std::vector<ShortReply> kShortNumber = {{0, {0, "0"}, {}}, {4, {0, "0"}, {}}};

// What is no map fails the call; `line` and those that follow it tell it.
std::vector<ShortReply> shortText(const std::string& before, const Lines& lines) {
    std::vector<ShortReply> rows;
    for (size_t bytes : {0, 4, 8}) {
        rows.push_back({bytes, {STATUS_INVALID_FORMAT, before}, lines});
    }
    return rows;
}

Operation companionRow(const char* name, std::function<Outcome(Clients&)> call,
                       const char* refusedInProxy, const char* deadInProxy,
                       const char* failedInClient) {
    Operation row{};
    row.client = kCompanion;
    row.name = name;
    row.service = 0;
    row.call = std::move(call);
    row.reply = statusAlone;
    row.shortReplies = kShortStatus;
    row.refusedInProxy = refusedInProxy;
    row.deadInProxy = deadInProxy;
    row.refusedInClient = failedInClient;
    row.deadInClient = failedInClient;
    return row;
}

// For the operations that answer with a map.
Operation& withText(Operation& row, const std::string& answer, const std::string& before,
                    const std::string& after, const Lines& parseLines) {
    row.reply = statusThenText(answer);
    row.before = row.afterRefusal = before;
    row.after = after;
    row.shortReplies = shortText(before, parseLines);
    return row;
}

Outcome sendCommandMap(Clients& clients) {
    SerializableMap request;
    request.add("q", 1);
    SerializableMap response;
    response.add("old", 1);
    int status = clients.companion->sendCommand(request, response);
    return {status, response.serialize()};
}

Outcome sendCommandText(Clients& clients) {
    static char untouched[] = "untouched";
    char* result = untouched;
    int status = clients.companion->sendCommand("status 1", &result);
    Outcome outcome{status, result};
    if (result != untouched) {
        free(result);
    }
    return outcome;
}

Outcome getConfiguration(Clients& clients) {
    SerializableMap params;
    params.add("a", 1);
    int status = clients.companion->getConfigParams(params);
    return {status, params.serialize()};
}

Outcome getBinaryConfiguration(Clients& clients) {
    char buffer[9] = "--------";
    size_t length = 8;
    int status = clients.companion->getConfigParams(buffer, &length);
    return {status, buffer + number(static_cast<int>(length))};
}

std::vector<Operation> companionOperations() {
    const std::string path = "/f";
    const std::string invalid = errStr(STATUS_INVALID_FORMAT);
    std::vector<Operation> rows = {
            companionRow(
                    "setRecordOutput",
                    [](Clients& c) { return plain(c.companion->setRecordOutput(0)); },
                    "setRecordOutput() error: %s", "setRecordParameter() error: %s",
                    "output parameter(0) is wrong"),
            companionRow(
                    "setRecordFile",
                    [path](Clients& c) { return plain(c.companion->setRecordFile(path)); },
                    "setRecordFile() error: %s", "setRecordFile() error: %s", "setDumpFile failed"),
            companionRow(
                    "stopRecord", [](Clients& c) { return plain(c.companion->stopRecord()); },
                    "stopRecord() error: %s", "stopRecord() error: %s", "stopRecord failed"),
            companionRow(
                    "sendEvent",
                    [](Clients& c) {
                        return plain(c.companion->sendEvent(eventType(1), eventParam(2)));
                    },
                    "reloadConfig() error: %s", "sendEvent() error: %s", "sendEvent failed"),
            companionRow(
                    "reloadConfig",
                    [](Clients& c) { return plain(c.companion->reloadConfig(nullptr)); },
                    "reloadConfig() error: %s", "reloadConfig() error: %s", "reloadConfig failed"),
            companionRow(
                    "reloadConfigFromPath",
                    [path](Clients& c) { return plain(c.companion->reloadConfig(&path)); },
                    "reloadConfig() error: %s", "reloadConfig() error: %s", "reloadConfig failed"),
            companionRow(
                    "saveConfig",
                    [](Clients& c) { return plain(c.companion->saveConfig(nullptr)); },
                    "saveConfig() error: %s", "saveConfig() error: %s", "saveConfig failed"),
            companionRow(
                    "saveConfigToPath",
                    [path](Clients& c) { return plain(c.companion->saveConfig(&path)); },
                    "saveConfig() error: %s", "saveConfig() error: %s", "saveConfig failed"),
            companionRow(
                    "setConfigParams",
                    [](Clients& c) { return plain(c.companion->setConfigParams("abc", 3)); },
                    "setConfigParams() (binary) error: %s", "setConfigParams() (binary) error: %s",
                    "setConfigParams (binary) failed"),
            companionRow(
                    "restoreSession",
                    [](Clients& c) { return plain(c.companion->restoreSession(7)); },
                    "restoreSession() error: %s", "restoreSession() error: %s", nullptr),
            companionRow(
                    "setAuth", [](Clients& c) { return plain(c.companion->setAuth("sesame")); },
                    nullptr, nullptr, "setAuth failed"),
    };

    // The first of its two calls is asked for no status.
    Operation start = companionRow(
            "startRecord", [](Clients& c) { return plain(c.companion->startRecord()); },
            "startRecord() error: %s", "prepareRecord() error: %s", "startRecord failed");
    start.deadInClient = "fail to prepare recording";
    rows.push_back(start);

    // The answer is the size itself, and any failure too.
    Operation packet = companionRow(
            "getPacketSize", [](Clients& c) { return plain(c.companion->getPacketSize()); },
            nullptr, "getPacketSize() error: %s", nullptr);
    rows.push_back(packet);

    Operation inspect = companionRow(
            "inspect",
            [](Clients& c) {
                unsigned int value = 1;
                int status = c.companion->inspect(&value);
                return Outcome{status, std::to_string(value)};
            },
            "inspect() error: %s", "inspect() error: %s", nullptr);
    inspect.reply = statusThenNumber(99);
    inspect.before = inspect.afterRefusal = "1";
    inspect.after = "99";
    inspect.shortReplies = kShortNumber;
    rows.push_back(inspect);

    Operation save = companionRow(
            "saveSession",
            [](Clients& c) {
                int session = 1;
                int status = c.companion->saveSession(session);
                return Outcome{status, number(session)};
            },
            "saveSession() error: %s", "saveSession() error: %s", nullptr);
    save.reply = statusThenNumber(99);
    save.before = save.afterRefusal = "1";
    save.after = "99";
    save.shortReplies = kShortNumber;
    rows.push_back(save);

    Operation config = companionRow("getConfigParamsMap", getConfiguration,
                                    "getConfigParams() reply error: %s",
                                    "getConfigParams() transact error: %s", nullptr);
    rows.push_back(withText(config, R"({"a":2})", R"({"a":1})", R"({"a":2})",
                            {"E getConfigParams() unserialize error: " + invalid, "E string: "}));

    Operation binary =
            companionRow("getConfigParamsBinary", getBinaryConfiguration, nullptr,
                         "getConfigParams() (binary) error: %s", "getConfigParams (binary) failed");
    binary.reply = configuration;
    binary.canRefuse = false;
    binary.before = "--------8";
    binary.after = "abcd----4";
    binary.shortReplies = {{0,
                            {STATUS_UNKNOWN_ERROR, "--------8"},
                            {"E getConfigParams: Error! unable to get binary config params."}},
                           {4,
                            {STATUS_UNKNOWN_ERROR, "--------8"},
                            {"E getConfigParams() (binary) error: No data available"}}};
    rows.push_back(binary);

    const Lines unreadable = {"E sendCommand() error2: " + invalid};
    Operation map = companionRow("sendCommandMap", sendCommandMap, "sendCommand() error1: %s",
                                 "sendCommand() error: %s", "sendCommand failed");
    rows.push_back(withText(map, R"({"r":1})", R"({"old":1})", R"({"r":1})", unreadable));

    Operation text = companionRow("sendCommand", sendCommandText, "sendCommand() error1: %s",
                                  "sendCommand() error: %s", nullptr);
    rows.push_back(withText(text, kAnswer, "untouched", "done", unreadable));

    Operation filter = companionRow(
            "setRecordFilter", [](Clients& c) { return plain(c.companion->setRecordFilter(1)); },
            "sendCommand() error1: %s", "sendCommand() error: %s", nullptr);
    rows.push_back(withText(filter, kFilterAnswer, "", "", unreadable));

    Operation property = companionRow(
            "setProperty",
            [](Clients& c) { return plain(c.companion->setProperty("setRollingLogSize", "5")); },
            "sendCommand() error1: %s", "sendCommand() error: %s", nullptr);
    rows.push_back(withText(property, R"({"r":1})", "", "", unreadable));
    return rows;
}

// The managers' proxies log no status of the service's, their clients log every failure.
Operation managerRow(const char* client, int service, const char* name,
                     std::function<Outcome(Clients&)> call, const char* deadInProxy,
                     const char* failedInClient) {
    Operation row{};
    row.client = client;
    row.name = name;
    row.service = service;
    row.call = std::move(call);
    row.reply = statusAlone;
    row.shortReplies = kShortStatus;
    row.deadInProxy = deadInProxy;
    row.refusedInClient = row.deadInClient = row.absentInClient = failedInClient;
    return row;
}

// A number comes before the status, and is stored whatever that is.
Operation withNumber(Operation row, int sent, const std::string& before, const std::string& after,
                     const std::string& zero) {
    row.reply = numberThenStatus(sent);
    row.before = before;
    row.after = row.afterRefusal = after;
    row.shortReplies = {{0, {0, zero}, {}}, {4, {0, after}, {}}};
    return row;
}

template <typename Value, typename Call>
std::function<Outcome(Clients&)> storing(Value before, Call call) {
    return [=](Clients& clients) {
        Value value = before;
        int status = call(clients, value);
        return Outcome{status, std::to_string(value)};
    };
}

std::vector<Operation> touchOperations() {
    auto row = [](const char* name, std::function<Outcome(Clients&)> call, const char* dead,
                  const char* failed) {
        return managerRow(kTouch, 1, name, std::move(call), dead, failed);
    };
    return {
            withNumber(row("isSupported",
                           storing(false,
                                   [](Clients& c, bool& v) { return c.touch->isSupported(1, v); }),
                           "isSupported() error: %s", "isSupported failed: %s"),
                       1, "0", "1", "0"),
            withNumber(row("isEnabled",
                           storing(false,
                                   [](Clients& c, bool& v) { return c.touch->isEnabled(1, v); }),
                           "isEnabled() error: %s", "isEnabled failed: %s"),
                       1, "0", "1", "0"),
            row(
                    "enable", [](Clients& c) { return plain(c.touch->enable(1)); },
                    "enable() error: %s", "enable failed: %s"),
            row(
                    "disable", [](Clients& c) { return plain(c.touch->disable(1)); },
                    "disable() error: %s", "disable failed: %s"),
            row(
                    "configure_vm_region",
                    [](Clients& c) {
                        Rect region(0, 0, 1, 1);
                        return plain(c.touch->configure_vm_region(region, true));
                    },
                    "configure_vm_region() error: %s", "disable failed: %s"),
    };
}

std::vector<Operation> gestureOperations() {
    auto row = [](const char* name, std::function<Outcome(Clients&)> call, const char* dead,
                  const char* failed) {
        Operation row = managerRow(kGesture, 2, name, std::move(call), dead, failed);
        row.deathNotice = "E Gesture Manager Service died!";
        return row;
    };
    return {
            row(
                    "enableWakeup", [](Clients& c) { return plain(c.gesture->enableWakeup()); },
                    "enable() error: %s", "enable failed: %s"),
            row(
                    "disableWakeup", [](Clients& c) { return plain(c.gesture->disableWakeup()); },
                    "disable() error: %s", "disable failed: %s"),
            row(
                    "startGestureDetection",
                    [](Clients& c) { return plain(c.gesture->startGestureDetection()); },
                    "startGestureDetection() error: %s", "enable failed: %s"),
            row(
                    "stopGestureDetection",
                    [](Clients& c) { return plain(c.gesture->stopGestureDetection()); },
                    "stopGestureDetection() error: %s", "enable failed: %s"),
            withNumber(row("addGesture",
                           storing(1, [](Clients& c,
                                         int& v) { return c.gesture->addGesture(0, nullptr, v); }),
                           "addGesture() error: %s", "addGesture failed: %s"),
                       -9, "1", "-9", "0"),
            row(
                    "deleteGesture", [](Clients& c) { return plain(c.gesture->deleteGesture(1)); },
                    "deleteGesture() error: %s", "deleteGesture failed: %s"),
            row(
                    "enableGesture", [](Clients& c) { return plain(c.gesture->enableGesture(1)); },
                    "enableGesture() error: %s", "enableGesture failed: %s"),
            row(
                    "disableGesture",
                    [](Clients& c) { return plain(c.gesture->disableGesture(1)); },
                    "disableGesture() error: %s", "disableGesture failed: %s"),
            withNumber(
                    row("verifyGesture",
                        storing(1, [](Clients& c,
                                      int& v) { return c.gesture->verifyGesture(nullptr, v); }),
                        "improveGestureTraining() error: %s", "improveGestureTraining failed: %s"),
                    -9, "1", "-9", "0"),
            withNumber(
                    row("getMaxPreDefinedGesture",
                        storing(1u,
                                [](Clients& c, unsigned int& v) {
                                    return c.gesture->getMaxPreDefinedGesture(v);
                                }),
                        "getMaxPreDefinedGesture error: %s", "getMaxPreDefinedGesture failed: %s"),
                    9, "1", "9", "0"),
            withNumber(row("getMaxUserDefinedGesture",
                           storing(1u,
                                   [](Clients& c, unsigned int& v) {
                                       return c.gesture->getMaxUserDefinedGesture(v);
                                   }),
                           "getMaxUserDefinedGesture error: %s",
                           "getMaxUserDefinedGesture failed: %s"),
                       9, "1", "9", "0"),
    };
}

Outcome getProfiles(Clients& clients) {
    std::vector<std::string> names = {"held"};
    int status = clients.hand->getProfileList(names);
    std::string stored;
    for (const std::string& name : names) {
        stored += name + " ";
    }
    return {status, stored};
}

std::vector<Operation> handOperations() {
    auto row = [](const char* name, std::function<Outcome(Clients&)> call, const char* dead,
                  const char* failed) {
        Operation row = managerRow(kHand, 3, name, std::move(call), dead, failed);
        row.deathNotice = "E HB Manager Service died!";
        return row;
    };
    std::vector<Operation> rows = {
            row(
                    "startEnrollment", [](Clients& c) { return plain(c.hand->startEnrollment()); },
                    "startEnrollment error: %s", "startEnrollment failed: %s"),
            row(
                    "stopEnrollment", [](Clients& c) { return plain(c.hand->stopEnrollment()); },
                    "stopEnrollment error: %s", "stopEnrollment failed: %s"),
            row(
                    "scan", [](Clients& c) { return plain(c.hand->scan()); }, "scan error: %s",
                    "scan failed: %s"),
            row(
                    "startMatching", [](Clients& c) { return plain(c.hand->startMatching()); },
                    "startMatching error: %s", "startMatching failed: %s"),
            row(
                    "stopMatching", [](Clients& c) { return plain(c.hand->stopMatching()); },
                    "stopMatching error: %s", "stopMatching failed: %s"),
            row(
                    "cancelScan", [](Clients& c) { return plain(c.hand->cancelScan()); },
                    "cancelScan error: %s", "cancelScan failed: %s"),
            row(
                    "setSecurity", [](Clients& c) { return plain(c.hand->setSecurity(2)); },
                    "setSecurity error: %s", "setSecurity failed: %s"),
            row(
                    "setProfileName", [](Clients& c) { return plain(c.hand->setProfileName("a")); },
                    "setProfileName error: %s", "setProfileName failed: %s"),
            row(
                    "deleteProfile", [](Clients& c) { return plain(c.hand->deleteProfile("a")); },
                    "deleteProfile error: %s", "setProfileName failed: %s"),
            row(
                    "renameProfile",
                    [](Clients& c) { return plain(c.hand->renameProfile("a", "b")); },
                    "renameProfile error: %s", "setProfileName failed: %s"),
            withNumber(row("getMaxUser",
                           storing(1u, [](Clients& c,
                                          unsigned int& v) { return c.hand->getMaxUser(v); }),
                           "getMaxUser error: %s", "getMaxUser failed: %s"),
                       9, "1", "9", "0"),
            row(
                    "enableWakeup", [](Clients& c) { return plain(c.hand->enableWakeup()); },
                    "enable() error: %s", "enable failed: %s"),
            row(
                    "disableWakeup", [](Clients& c) { return plain(c.hand->disableWakeup()); },
                    "disable() error: %s", "disable failed: %s"),
    };
    Operation list = row("getProfileList", getProfiles, "getProfileList error: %s",
                         "getProfileList failed: %s");
    list.reply = twoNamesThenStatus;
    list.before = "held ";
    list.after = list.afterRefusal = "held alice barbara ";
    // The names are 8 bytes each; the last four bytes of a reply are taken for its status.
    list.shortReplies = {{0, {0, "held "}, {}},
                         {4, {STATUS_CORRUPT_DATA, "held "}, {}},
                         {12, {STATUS_CORRUPT_DATA, "held alice "}, {}},
                         {16, {STATUS_CORRUPT_DATA, "held alice "}, {}},
                         {20, {STATUS_CORRUPT_DATA, "held alice barbara "}, {}}};
    rows.push_back(list);
    return rows;
}

}  // namespace

namespace {

// Not a member of what a late notice might outlive.
std::atomic<int> gDeaths;

void countDeath(void* deaths) {
    ++*static_cast<std::atomic<int>*>(deaths);
}

}  // namespace

Clients::Clients()
        : companion(new TouchCompanionClient),
          touch(new TouchManagerClient),
          gesture(new GestureManagerClient(nullptr, countDeath, &gDeaths)),
          hand(new HandBiometricManagerClient(nullptr, countDeath, &gDeaths)) {
    gDeaths = 0;
}

Clients::~Clients() {
    touch->deinit();
    gesture->deinit();
    hand->deinit();
}

int Clients::deaths() const {
    return gDeaths;
}

std::ostream& operator<<(std::ostream& stream, const Outcome& outcome) {
    return stream << "status 0x" << std::hex << outcome.status << std::dec << ", stored \""
                  << outcome.stored << '"';
}

std::ostream& operator<<(std::ostream& stream, const Operation& operation) {
    return stream << operation.client << "::" << operation.name;
}

const std::vector<Operation>& allOperations() {
    static const std::vector<Operation> all = [] {
        std::vector<Operation> rows;
        for (const auto& part :
             {companionOperations(), touchOperations(), gestureOperations(), handOperations()}) {
            rows.insert(rows.end(), part.begin(), part.end());
        }
        return rows;
    }();
    return all;
}

Lines errorLines(const char* format, const char* reason) {
    return format == nullptr ? Lines{} : Lines{"E " + textOf(format, reason)};
}

}  // namespace pemaro::test
