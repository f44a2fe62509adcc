// SPDX-License-Identifier: Apache-2.0
#include <algorithm>
#include <memory>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/touch/TouchCommands.h"
#include "tools/zelkctl/conformance/Operations.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/EventRecord.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/services/MapText.h"
#include "tools/zelkctl/services/StackQuery.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

using Words = std::vector<std::string>;

Words features() {
    Words words;
    const android::sp<TouchManagerClient> client = TouchManager::create(nullptr);
    if (ServiceWatch::find(TouchManager::kService) != nullptr &&
        call("init", [&] { return client->init(); }) == STATUS_NO_ERROR) {
        for (const Feature& feature : supportedFeatures(*client)) {
            words.push_back(std::to_string(feature.number));
        }
        client->deinit();
    }
    return words;
}

Words profiles() {
    Words words;
    const android::sp<HandBiometricManagerClient> client = HandManager::create(nullptr);
    if (ServiceWatch::find(HandManager::kService) != nullptr &&
        call("init", [&] { return client->init(); }) == STATUS_NO_ERROR) {
        call("getProfileList", [&] { return client->getProfileList(words); });
        client->deinit();
    }
    return words;
}

/// The first word of each line that the simulated stack answers with.
Words firstWords(const std::string& command) {
    Words words = tryQueryStack(command);
    for (std::string& word : words) {
        word.resize(std::min(word.find(' '), word.size()));
    }
    return words;
}

/// The keys of a map that the touch companion tells.
Words keysFrom(int (ITouchCompanionService::*read)(SerializableMap&), const char* operation) {
    Words words;
    withService([&](ITouchCompanionService& service) {
        SerializableMap map;
        if (call(operation, [&] { return (service.*read)(map); }) == STATUS_NO_ERROR) {
            words = keysOf(map);
        }
        return tools::kExitSuccess;
    });
    return words;
}

/// What may stand for an operand or an option's value, and whether a service is asked for it.
struct Kind {
    const char* word;
    bool isAsked;
    Words (*find)();
};

const Kind kKinds[] = {
        {"EVENT", false, handEventNames},
        {"FEATURE", true, features},
        {"GESTURE", true, [] { return firstWords("gestures"); }},
        {"KEY", true, [] { return firstWords("keys"); }},
        {"PARAMETER", true,
         [] { return keysFrom(&ITouchCompanionService::getAFEParams, "getAFEParams"); }},
        {"PROFILE", true, profiles},
        {"PROPERTY", true,
         [] { return keysFrom(&ITouchCompanionService::getProperties, "getProperties"); }},
        {"SERVICE", false, checkedWords},
        {"SESSION", true, [] { return firstWords("sessions"); }},
        {"SETTING", false, [] { return Words{"setRollingLogSize"}; }},
};

int printWords(const Kind& kind) {
    if (kind.isAsked) {
        const int exitStatus = startBinder();
        if (exitStatus != tools::kExitSuccess) {
            return exitStatus;
        }
    }
    for (const std::string& word : kind.find()) {
        say(printable(word));
    }
    return tools::kExitSuccess;
}

}  // namespace

void addWordsCommand(CLI::App& app, Action& action) {
    Words words;
    for (const Kind& kind : kKinds) {
        words.emplace_back(kind.word);
    }
    auto chosen = std::make_shared<std::string>();
    Command(app, action, "words", "Print what may stand for an operand")
            .choice(*chosen, words, "The operand")
            .hidden()
            .runs([chosen] {
                return printWords(*std::find_if(
                        std::begin(kKinds), std::end(kKinds),
                        [&chosen](const Kind& kind) { return kind.word == *chosen; }));
            });
}

}  // namespace pemaro::zelkctl
