// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/conformance/Operations.h"

#include <fmt/core.h>
#include <utils/String8.h>

#include <algorithm>

#include "pemaro/IGestureManagerClient.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"

using android::Parcel;

namespace pemaro::zelkctl {
namespace {

constexpr int32_t kNoSuchNumber = -77;
constexpr const char* kNoSuchName = "\x01no profile has this name";

void writeText(Parcel& request, const std::string& text) {
    request.writeString8(android::String8(text.data(), text.size()));
}

void feature(Parcel& request) {
    request.writeInt32(1);
}

void noSuch(Parcel& request) {
    request.writeInt32(kNoSuchNumber);
}

void emptyMap(Parcel& request) {
    writeText(request, SerializableMap().serialize());
}

void noEvent(Parcel& request) {
    request.writeInt32(0);
    request.writeInt32(0);
}

void noLength(Parcel& request) {
    request.writeInt32(0);
}

void wholeConfiguration(Parcel& request) {
    request.writeInt32(512 * 1024);
}

void noName(Parcel& request) {
    request.writeCString(kNoSuchName);
}

void emptyGesture(Parcel& request) {
    const std::string zeros(sizeof(IGestureManagerClient::GestureData), '\0');
    request.write(zeros.data(), zeros.size());
}

/// Reads one field; what is wrong with it.
std::string fieldProblem(const Parcel& reply, char field, int32_t* status) {
    int32_t number = 0;
    const bool isText = field == 'm' || field == 'a';
    if (reply.dataAvail() < sizeof(number)) {
        return "the reply ends too early";
    }
    if (!isText) {
        reply.readInt32(&number);
    }
    switch (field) {
        case 'S':
            if (status != nullptr) {
                *status = number;
            }
            return isKnownStatus(number) ? "" : fmt::format("{} is no known status", number);
        case 'u':
            return number >= 0 ? "" : fmt::format("{} is no count", number);
        case 'p':
            return number > 0 && (number < STATUS_UNKNOWN_ERROR || isKnownStatus(number))
                           ? ""
                           : fmt::format("{} is no size of a packet", number);
        case 'b':
            return number == 0 || number == 1 ? "" : fmt::format("{} is no answer", number);
        case 'B': {
            const size_t padded = (static_cast<size_t>(std::max(number, 0)) + 3) & ~size_t{3};
            if (number < 0 || reply.dataAvail() < padded) {
                return fmt::format("a length of {} bytes, with {} there", number,
                                   reply.dataAvail());
            }
            reply.setDataPosition(reply.dataPosition() + padded);
            return "";
        }
        case 'n':
            if (number < 0) {
                return fmt::format("{} is no count", number);
            }
            for (int32_t i = 0; i < number; ++i) {
                if (reply.readCString() == nullptr) {
                    return fmt::format("{} names announced, and {} there", number, i);
                }
            }
            return "";
        case 'm':
        case 'a': {
            const android::String8 text = reply.readString8();
            const std::string content(text.c_str(), text.size());
            SerializableMap map;
            SerializableMapArray array;
            const int result = field == 'm' ? map.unserialize(content) : array.unserialize(content);
            // A map without keys is written as a text that is no map.
            return result == STATUS_NO_ERROR || content == SerializableMap().serialize()
                           ? ""
                           : "a map that cannot be read";
        }
        default:
            return "";
    }
}

}  // namespace

// Each transaction is called here, or a comment tells by its code why it is not: check-interfaces
// looks for it.
const std::vector<CheckedInterface>& checkedInterfaces() {
    static const std::vector<CheckedInterface> interfaces = {
            {CheckedService::kCompanion,
             knownService("companion"),
             {
                     {14, "getProperties", noArguments, "Sm", Harm::kNone},
                     {15, "getAFEParams", noArguments, "Sm", Harm::kNone},
                     {17, "getAFEParams of all channels", noArguments, "Sa", Harm::kNone},
                     {20, "getPacketSize", noArguments, "p", Harm::kNone},
                     {22, "getConfigParams of no bytes", noLength, "u", Harm::kNone},
                     {22, "getConfigParams of all bytes", wholeConfiguration, "B", Harm::kNone},
                     {23, "inspect", noArguments, "Si", Harm::kNone},
                     {24, "getConfigParams of no key", emptyMap, "Sm", Harm::kNone},
                     {9, "sendEvent", noEvent, "S", Harm::kState},
                     {13, "setRecordParameter of no output", noSuch, "S", Harm::kState},
                     {16, "setAFEParams of nothing", emptyMap, "S", Harm::kState},
                     {25, "sendCommand of none", emptyMap, "Sm", Harm::kState},
                     {26, "saveSession", noArguments, "Si", Harm::kState},
                     {27, "restoreSession of none", noSuch, "S", Harm::kState},
                     // Parts of a recording, which has checks of its own (RecordingChecks.cpp):
                     // 1 registerClient, 2 unregisterClient, 3 open, 4 getCblk, 5 prepareRecord,
                     // 6 startRecord, 7 stopRecord.
                     // They write over what somebody keeps: 8 setRecordFile, 11 reloadConfig,
                     // 12 reloadConfig, 18 saveConfig, 19 saveConfig, 21 setConfigParams.
                     // They take something from the others: 10 close, 28 setAuth.
             }},
            {CheckedService::kTouch,
             knownService("touch"),
             {
                     {3, "isSupported", feature, "bS", Harm::kNone},
                     {3, "isSupported of no feature", noSuch, "bS", Harm::kNone},
                     {4, "isEnabled", feature, "bS", Harm::kNone},
                     {4, "isEnabled of no feature", noSuch, "bS", Harm::kNone},
                     {5, "enable of no feature", noSuch, "S", Harm::kState},
                     {6, "disable of no feature", noSuch, "S", Harm::kState},
                     // In SubscriptionChecks.cpp: 1 subscribe, 2 unsubscribe.
                     // No region is none, and there is no asking for the one in force:
                     // 7 configure_vm_region.
             }},
            {CheckedService::kGesture,
             knownService("gesture"),
             {
                     {12, "getMaxPreDefinedGesture", noArguments, "uS", Harm::kNone},
                     {13, "getMaxUserDefinedGesture", noArguments, "uS", Harm::kNone},
                     {7, "addGesture of a negative count", noSuch, "iS", Harm::kState},
                     {8, "deleteGesture of none", noSuch, "S", Harm::kState},
                     {9, "enableGesture of none", noSuch, "S", Harm::kState},
                     {10, "disableGesture of none", noSuch, "S", Harm::kState},
                     {11, "improveGestureTraining of nothing", emptyGesture, "iS", Harm::kState},
                     // In SubscriptionChecks.cpp: 1 subscribe, 2 unsubscribe.
                     // A switch whose state cannot be asked for and put back: 3 enableWakeup,
                     // 4 disableWakeup, 5 startGestureDetection, 6 stopGestureDetection.
             }},
            {CheckedService::kHand,
             knownService("hand"),
             {
                     {13, "getMaxUser", noArguments, "uS", Harm::kNone},
                     {14, "getProfileList", noArguments, "nS", Harm::kNone},
                     {9, "setSecurity of no level", noSuch, "S", Harm::kState},
                     {11, "deleteProfile of none", noName, "S", Harm::kState},
                     // In SubscriptionChecks.cpp: 1 subscribe, 2 unsubscribe.
                     // Somebody's hand is asked for: 3 startEnrollment, 4 stopEnrollment, 5 scan,
                     // 6 startMatching, 7 stopMatching, 8 cancelScan.
                     // No name is refused by all: 10 setProfileName, 12 renameProfile.
                     // A switch whose state cannot be asked for and put back: 15 enableWakeup,
                     // 16 disableWakeup.
             }},
    };
    return interfaces;
}

std::vector<std::string> checkedWords() {
    std::vector<std::string> words;
    for (const CheckedInterface& interface : checkedInterfaces()) {
        words.emplace_back(interface.word);
    }
    return words;
}

bool isKnownStatus(int32_t status) {
    return status == STATUS_NO_ERROR ||
           (status >= STATUS_UNKNOWN_ERROR && status <= STATUS_CORRUPT_DATA);
}

std::string replyProblem(const Parcel& reply, const char* layout, int32_t* status) {
    reply.setDataPosition(0);
    for (const char* field = layout; *field != '\0'; ++field) {
        std::string problem = fieldProblem(reply, *field, status);
        if (!problem.empty()) {
            return problem;
        }
    }
    return reply.dataAvail() == 0
                   ? ""
                   : fmt::format("{} bytes too many in the reply", reply.dataAvail());
}

}  // namespace pemaro::zelkctl
