// SPDX-License-Identifier: Apache-2.0

// Reads every input as a map and as an array, with the library and with the reference, and stops where
// they differ. Inputs are kept short, for the reference takes quadratic time and stack in their depth.

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>

#include "tests/values/reference/Comparison.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using pemaro::reference::As;
    constexpr size_t kLongest = 4096;
    if (size > kLongest) return -1;
    const std::string text(reinterpret_cast<const char*>(data), size);
    for (const As as : {As::kMap, As::kArray}) {
        const pemaro::reference::Comparison comparison = pemaro::reference::compare(text, as);
        if (comparison.difference.empty() && !comparison.endedInSpace) continue;
        fprintf(stderr, "as %s:\n%s", as == As::kMap ? "a map" : "an array",
                comparison.difference.c_str());
        abort();
    }
    return 0;
}
