// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Printable.h"

#include <algorithm>

namespace pemaro::zelkctl {

std::string printable(std::string name) {
    std::replace_if(
            name.begin(), name.end(), [](unsigned char byte) { return byte < ' ' || byte == 0x7F; },
            '?');
    return name;
}

std::string joined(const std::vector<std::string>& words) {
    std::string list;
    for (const std::string& word : words) {
        list += (list.empty() ? "" : ", ") + word;
    }
    return list;
}

}  // namespace pemaro::zelkctl
