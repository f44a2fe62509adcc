// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"

namespace pemaro {

/// The text form of a map and of an array.
std::string writeText(const SerializableMap& map);
std::string writeText(const SerializableMapArray& array);

}  // namespace pemaro
