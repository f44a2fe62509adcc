// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"
#include "pemaro/SerializableValue.h"

#include <utils/Vector.h>
#include <string>

namespace pemaro {

/// A list of values, in the order in which they were added. Its text form is a bracketed list
/// (docs/text-format.md tells the format). Copies of an array share nothing.
///
/// Not synchronised: an array belongs to one thread at a time.
class ZELK_API SerializableMapArray {
  public:
    /// Makes an empty array or a deep copy of another, and destroys the elements.
    SerializableMapArray();
    SerializableMapArray(const SerializableMapArray& other);
    virtual ~SerializableMapArray();

    /// Replaces the elements by deep copies of the other's.
    SerializableMapArray& operator=(const SerializableMapArray& other);

    /// The element at `index`, valid until the array is changed. An index at or past the end is
    /// fatal.
    const SerializableValue& get(unsigned long index) const;

    /// The element at `index`, to be changed in place, valid until the array is changed.
    /// REQUIRES: `index` is below the number of elements; this is not checked.
    SerializableValue& get(unsigned long index);

    /// Replaces the element at `index` by a copy of `value` and returns 0;
    /// STATUS_INDEX_OUT_OF_BOUNDS when there is no such element.
    int set(unsigned long index, const SerializableValue& value);

    /// Appends a copy of `value` and returns 0.
    int add(const SerializableValue& value);

    /// Removes all elements.
    void clear();

    /// The text form.
    std::string serialize();

    /// Replaces the elements, all of them, by what `text` holds, up to its first NUL if it has one.
    /// Returns 0, or STATUS_INVALID_FORMAT after logging the reason, and then the array is as it
    /// was. A scalar without any text, as in `[1, ,2]`, is fatal. Takes time and memory linear in
    /// the length of the text and a fixed amount of stack.
    int unserialize(const std::string& text);

  private:
    friend struct ValueAccess;

    android::Vector<SerializableValue> mElements;
};

}  // namespace pemaro
