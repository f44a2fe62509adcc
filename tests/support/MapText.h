// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>

#include <string>

#include "pemaro/SerializableMap.h"

namespace pemaro::test {

/// The map that `text` holds.
inline SerializableMap mapOf(const std::string& text) {
    SerializableMap map;
    EXPECT_EQ(0, map.unserialize(text)) << text;
    return map;
}

}  // namespace pemaro::test
