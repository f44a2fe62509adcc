// SPDX-License-Identifier: Apache-2.0
#include <algorithm>
#include <memory>
#include <vector>

#include "tools/zelkctl/commands/touch/TouchCommands.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {
namespace {

using Client = TouchManagerClient;

/// The service has no list of its features: each number has to be asked for.
constexpr int kLastFeature = 31;

struct FeaturesOptions {
    int first = 0;
    int last = kLastFeature;
};

/// Whether a feature is supported, and then whether it is enabled; a status.
int askFor(Client& client, int number, bool& supported, bool& enabled) {
    const int status = call("isSupported", [&] { return client.isSupported(number, supported); });
    return status == STATUS_NO_ERROR && supported
                   ? call("isEnabled", [&] { return client.isEnabled(number, enabled); })
                   : status;
}

/// The supported ones of the features that were asked for.
int collectFeatures(Client& client, const FeaturesOptions& options,
                    std::vector<Feature>& features) {
    for (int64_t number = options.first; number <= options.last; ++number) {
        if (mustStop()) {
            return failStopped();
        }
        Feature feature{static_cast<int>(number), false};
        bool supported = false;
        const int status = askFor(client, feature.number, supported, feature.enabled);
        if (status != STATUS_NO_ERROR) {
            return failStatus("touch features", status, fmt::format("feature {}", number));
        }
        if (supported) {
            features.push_back(feature);
        }
    }
    return tools::kExitSuccess;
}

int showFeatures(const FeaturesOptions& options) {
    return withManager<TouchManager>([&](Client& client) {
        std::vector<Feature> features;
        const int result = collectFeatures(client, options, features);
        for (const Feature& feature : features) {
            sayResult(fmt::format("{:10}  {}", feature.number,
                                  feature.enabled ? "enabled" : "disabled"),
                      JsonObject()
                              .add("feature", feature.number)
                              .addFlag("enabled", feature.enabled));
        }
        if (features.empty() && result == tools::kExitSuccess && !settings().json) {
            say(fmt::format("no feature from {} to {} is supported", options.first, options.last));
        }
        return result;
    });
}

}  // namespace

std::vector<Feature> supportedFeatures(Client& client) {
    std::vector<Feature> features;
    for (int number = 0; number <= kLastFeature && !mustStop(); ++number) {
        bool supported = false;
        bool enabled = false;
        if (askFor(client, number, supported, enabled) != STATUS_NO_ERROR) {
            return {};
        }
        if (supported) {
            features.push_back({number, enabled});
        }
    }
    return features;
}

std::string silenceOfTouch(Client& client) {
    const std::vector<Feature> features = supportedFeatures(client);
    const bool any = std::any_of(features.begin(), features.end(),
                                 [](const Feature& feature) { return feature.enabled; });
    return features.empty() || any
                   ? ""
                   : "no feature is enabled, and nothing will be reported (zelkctl touch enable "
                     "FEATURE)";
}

void addTouchFeaturesCommand(CLI::App& touch, Action& action) {
    auto options = std::make_shared<FeaturesOptions>();
    Command(touch, action, "features", "List the features that are supported")
            .number("--first", options->first, "First number to ask for (0)")
            .number("--last", options->last,
                    fmt::format("Last number to ask for ({})", kLastFeature))
            .check([options] { return tools::orderProblem(options->first, options->last); })
            .runs([options] { return showFeatures(*options); });
}

}  // namespace pemaro::zelkctl
