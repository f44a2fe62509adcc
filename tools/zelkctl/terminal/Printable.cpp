// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Printable.h"

#include <fmt/chrono.h>

namespace pemaro::zelkctl {

std::string joined(const std::vector<std::string>& words) {
    std::string list;
    for (const std::string& word : words) {
        list += (list.empty() ? "" : ", ") + word;
    }
    return list;
}

std::string timeOfDay(std::chrono::system_clock::time_point when) {
    const auto rounded = std::chrono::floor<std::chrono::milliseconds>(when);
    return fmt::format("{:%H:%M:%S}.{:03}",
                       fmt::localtime(std::chrono::system_clock::to_time_t(rounded)),
                       rounded.time_since_epoch().count() % 1000);
}

}  // namespace pemaro::zelkctl
