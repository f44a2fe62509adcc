// SPDX-License-Identifier: Apache-2.0
#include "tools/common/Printable.h"

#include <algorithm>

namespace pemaro::tools {

std::string printable(std::string text) {
    std::replace_if(
            text.begin(), text.end(), [](unsigned char byte) { return byte < ' ' || byte == 0x7F; },
            '?');
    return text;
}

}  // namespace pemaro::tools
