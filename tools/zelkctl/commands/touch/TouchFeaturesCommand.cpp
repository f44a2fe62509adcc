// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <vector>

#include "tools/zelkctl/commands/touch/TouchCommands.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {
namespace {

using Client = TouchManagerClient;

/// The service has no list of its features: each number has to be asked for.
constexpr int kLastFeature = 31;

struct Feature {
    int number;
    bool enabled;
};

struct FeaturesOptions {
    int first = 0;
    int last = kLastFeature;
    bool json = false;
};

/// The supported ones of the features that were asked for.
int collectFeatures(Client& client, const FeaturesOptions& options,
                    std::vector<Feature>& features) {
    for (int64_t number = options.first; number <= options.last; ++number) {
        Feature feature{static_cast<int>(number), false};
        bool supported = false;
        int status = client.isSupported(feature.number, supported);
        if (status == STATUS_NO_ERROR && supported) {
            status = client.isEnabled(feature.number, feature.enabled);
        }
        if (status != STATUS_NO_ERROR) {
            return failStatus(fmt::format("feature {}", number), status);
        }
        if (supported) {
            features.push_back(feature);
        }
    }
    return tools::kExitSuccess;
}

void printFeatures(const FeaturesOptions& options, const std::vector<Feature>& features) {
    if (options.json) {
        JsonArray array;
        for (const Feature& feature : features) {
            array.add(JsonObject()
                              .add("feature", feature.number)
                              .addFlag("enabled", feature.enabled));
        }
        fmt::print("{}\n", array.text());
        return;
    }
    if (features.empty()) {
        fmt::print("no feature from {} to {} is supported\n", options.first, options.last);
    }
    for (const Feature& feature : features) {
        fmt::print("{:10}  {}\n", feature.number, feature.enabled ? "enabled" : "disabled");
    }
}

int showFeatures(const FeaturesOptions& options) {
    return withManager<TouchManager>([&](Client& client) {
        std::vector<Feature> features;
        const int result = collectFeatures(client, options, features);
        if (result == tools::kExitSuccess) {
            printFeatures(options, features);
        }
        return result;
    });
}

}  // namespace

void addTouchFeaturesCommand(CLI::App& touch, Action& action) {
    auto options = std::make_shared<FeaturesOptions>();
    CLI::App* command = touch.add_subcommand("features", "List the features that are supported");
    command->add_option("--first", options->first, "First number to ask for")
            ->capture_default_str();
    command->add_option("--last", options->last, "Last number to ask for")->capture_default_str();
    command->add_flag("--json", options->json, "Print a JSON array");
    command->callback(
            [options, &action] { action = [options] { return showFeatures(*options); }; });
}

}  // namespace pemaro::zelkctl
