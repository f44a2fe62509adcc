// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/Binder.h"

namespace pemaro {

// A text in a parcel: as the platform's String8, all its bytes, a NUL among them too.

void writeText(android::Parcel& parcel, const std::string& text);

/// The next text; an empty one where there is none.
std::string readText(const android::Parcel& parcel);

}  // namespace pemaro
