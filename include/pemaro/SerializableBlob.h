// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"

#include <string>

namespace pemaro {

/// A block of bytes that owns its memory; copies have memory of their own.
///
/// A blob can be a value in a map, but its bytes are never written into a map's text: there it is
/// the four letters `blob`.
///
/// Not synchronised: a blob belongs to one thread at a time.
class ZELK_API SerializableBlob {
  public:
    /// No bytes, size 0.
    SerializableBlob();

    /// A copy of the `size` bytes at `data`; `data` is not looked at when `size` is 0.
    SerializableBlob(const void* data, unsigned long size);

    /// A copy of the bytes.
    SerializableBlob(const SerializableBlob& other);

    /// Frees the bytes.
    virtual ~SerializableBlob();

    /// Takes a copy of the other's bytes in place of its own.
    SerializableBlob& operator=(SerializableBlob other);

    /// Exchanges the bytes, without copying.
    void swap(SerializableBlob& other);

    /// Size in bytes.
    unsigned long getSize();

    /// Copies all bytes to `dest`, which has room for `capacity` of them, and returns their number.
    /// When they do not fit, copies none and returns 0: a caller cannot tell an empty blob from a
    /// `dest` that is too small, other than by `getSize`.
    unsigned long getValue(void* dest, unsigned long capacity);

    /// The four letters `blob`.
    std::string serialize();

  private:
    friend struct ValueAccess;

    unsigned char* mData;
    unsigned long mSize;
};

}  // namespace pemaro
