// SPDX-License-Identifier: Apache-2.0
#include <ui/Rect.h>
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
    bool on = false;
    bool off = false;
};

int configureRegion(const RegionOptions& options) {
    const std::string words = fmt::format("region {},{} to {},{}", options.left, options.top,
                                          options.right, options.bottom);
    return operate<TouchManager>(
            "configure_vm_region",
            [&](Client& client) {
                android::Rect region(options.left, options.top, options.right, options.bottom);
                return client.configure_vm_region(region, !options.off);
            },
            words + (options.off ? " off" : " on"),
            JsonObject()
                    .add("left", options.left)
                    .add("top", options.top)
                    .add("right", options.right)
                    .add("bottom", options.bottom)
                    .addFlag("on", !options.off),
            words);
}

}  // namespace

void addTouchRegionCommand(CLI::App& touch, Action& action) {
    auto options = std::make_shared<RegionOptions>();
    Command(touch, action, "region", "Configure a region of the screen")
            .number("LEFT", options->left, "Its first column")
            .number("TOP", options->top, "Its first row")
            .number("RIGHT", options->right, "The column behind it")
            .number("BOTTOM", options->bottom, "The row behind it")
            .flag("--on", options->on, "Switch the region on (the default)")
            .flag("--off", options->off, "Switch the region off")
            .excludes("--off", "--on")
            .details("No interface tells the region in force.")
            .runs([options] { return configureRegion(*options); });
}

}  // namespace pemaro::zelkctl
