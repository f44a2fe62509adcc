// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "pemaro/Binder.h"

namespace pemaro::test {

using Bytes = std::vector<uint8_t>;

/// Writes a parcel by hand, field after field.
using ParcelWriter = std::function<void(android::Parcel&)>;

/// The writer of a request without arguments, or of a reply without values.
inline void nothing(android::Parcel&) {}

/// All bytes of a parcel, wherever it is read.
Bytes bytesOf(const android::Parcel& parcel);

/// The bytes of the parcel that `write` writes.
Bytes parcelBytes(const ParcelWriter& write);

/// The bytes of a request: the interface token, then what `write` writes.
Bytes requestBytes(const std::string& descriptor, const ParcelWriter& write = {});

/// A request parcel to be filled: the interface token alone.
void writeToken(android::Parcel& parcel, const std::string& descriptor);

/// Text as it crosses: a String8 with all bytes of `text`.
void writeString8(android::Parcel& parcel, const std::string& text);

}  // namespace pemaro::test
