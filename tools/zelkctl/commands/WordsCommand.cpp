// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/touch/TouchCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/Managers.h"
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

int printWords(const std::string& kind) {
    if (kind == "PROPERTY") {
        say("setRollingLogSize");
        return tools::kExitSuccess;
    }
    const int exitStatus = startBinder();
    if (exitStatus != tools::kExitSuccess) {
        return exitStatus;
    }
    Words words;
    if (kind == "FEATURE") {
        words = features();
    } else if (kind == "PROFILE") {
        words = profiles();
    } else {
        words = firstWords(kind == "KEY" ? "keys" : kind == "SESSION" ? "sessions" : "gestures");
    }
    for (const std::string& word : words) {
        say(printable(word));
    }
    return tools::kExitSuccess;
}

}  // namespace

void addWordsCommand(CLI::App& app, Action& action) {
    auto kind = std::make_shared<std::string>();
    Command(app, action, "words", "Print what may stand for an operand")
            .choice(*kind, {"FEATURE", "GESTURE", "KEY", "PROFILE", "PROPERTY", "SESSION"},
                    "The operand")
            .hidden()
            .runs([kind] { return printWords(*kind); });
}

}  // namespace pemaro::zelkctl
