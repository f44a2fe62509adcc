// SPDX-License-Identifier: Apache-2.0
#include <ui/Rect.h>

#include <memory>
#include <vector>

#include "tools/zelkctl/ManagerCommands.h"

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

struct RegionOptions {
    int left = 0;
    int top = 0;
    int right = 0;
    int bottom = 0;
    bool off = false;
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
        const char* separator = "";
        fmt::print("[");
        for (const Feature& feature : features) {
            fmt::print("{}{{\"feature\":{},\"enabled\":{}}}", separator, feature.number,
                       feature.enabled);
            separator = ",";
        }
        fmt::print("]\n");
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

int configureRegion(const RegionOptions& options) {
    const std::string done = fmt::format("region {},{} to {},{} {}", options.left, options.top,
                                         options.right, options.bottom, options.off ? "off" : "on");
    return operate<TouchManager>(
            "configure_vm_region",
            [&](Client& client) {
                android::Rect region(options.left, options.top, options.right, options.bottom);
                return client.configure_vm_region(region, !options.off);
            },
            done);
}

void addFeaturesCommand(CLI::App& touch, Action& action) {
    auto options = std::make_shared<FeaturesOptions>();
    CLI::App* command = touch.add_subcommand("features", "List the features that are supported");
    command->add_option("--first", options->first, "First number to ask for")
            ->capture_default_str();
    command->add_option("--last", options->last, "Last number to ask for")->capture_default_str();
    command->add_flag("--json", options->json, "Print a JSON array");
    command->callback(
            [options, &action] { action = [options] { return showFeatures(*options); }; });
}

void addRegionCommand(CLI::App& touch, Action& action) {
    auto options = std::make_shared<RegionOptions>();
    CLI::App* command = touch.add_subcommand("region", "Configure a region of the screen");
    command->add_option("LEFT", options->left)->required();
    command->add_option("TOP", options->top)->required();
    command->add_option("RIGHT", options->right)->required();
    command->add_option("BOTTOM", options->bottom)->required();
    CLI::Option* on = command->add_flag("--on", "Switch the region on (the default)");
    command->add_flag("--off", options->off, "Switch the region off")->excludes(on);
    command->callback(
            [options, &action] { action = [options] { return configureRegion(*options); }; });
}

}  // namespace

void addTouchCommands(CLI::App& app, Action& action) {
    CLI::App* touch = app.add_subcommand("touch", "Talk to the touch manager");
    touch->require_subcommand(0, 1);
    addFeaturesCommand(*touch, action);
    addNumberCommand<TouchManager>(*touch, action, "enable", "Switch a feature on", "feature",
                                   "enable", &Client::enable);
    addNumberCommand<TouchManager>(*touch, action, "disable", "Switch a feature off", "feature",
                                   "disable", &Client::disable);
    addRegionCommand(*touch, action);
    addManagerWatchCommand<TouchManager>(*touch, action, "Print each gesture that is reported");
}

}  // namespace pemaro::zelkctl
