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

}  // namespace pemaro::zelkctl
