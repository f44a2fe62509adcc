// SPDX-License-Identifier: Apache-2.0
#include <ui/Rect.h>
#include <CLI/CLI.hpp>
#include <memory>

#include "tools/zelkctl/commands/touch/TouchCommands.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {
namespace {

using Client = TouchManagerClient;

struct RegionOptions {
    int left = 0;
    int top = 0;
    int right = 0;
    int bottom = 0;
    bool off = false;
};

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

}  // namespace

void addTouchRegionCommand(CLI::App& touch, Action& action) {
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

}  // namespace pemaro::zelkctl
