// SPDX-License-Identifier: Apache-2.0
#include "tools/touchstack/Source.h"

#include <fmt/core.h>

#include "tools/common/ExitStatus.h"
#include "tools/common/StandardOutput.h"

namespace pemaro::touchstack {
namespace {

using simulator::TouchScreen;

const std::string kEvdev = "evdev:";

bool isEvdev(const std::string& source) {
    return source.size() > kEvdev.size() && source.compare(0, kEvdev.size(), kEvdev) == 0;
}

}  // namespace

std::string sourceProblem(const std::string& source) {
    return isEvdev(source) || source == "list"
                   ? ""
                   : "'" + source + "' is neither evdev: and a device, nor list";
}

int listSources() {
    for (const std::string& path : TouchScreen::list()) {
        std::string problem;
        const auto screen = TouchScreen::open(path, &problem);
        if (screen != nullptr) {
            tools::writeOutput(fmt::format("{}{}  {}, {} fingers\n", kEvdev, path, screen->name(),
                                           screen->maxFingers()));
        }
    }
    return tools::outputProblem().empty() ? tools::kExitSuccess : tools::kExitFailure;
}

std::shared_ptr<TouchScreen> openSource(const std::string& source, std::string* problem) {
    return isEvdev(source) ? TouchScreen::open(source.substr(kEvdev.size()), problem) : nullptr;
}

std::string describeSource(const TouchScreen& screen) {
    return fmt::format("{}, {}, {} fingers", screen.path(), screen.name(), screen.maxFingers());
}

}  // namespace pemaro::touchstack
