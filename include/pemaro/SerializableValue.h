// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"

#include <cstdint>
#include <string>

namespace pemaro {

class SerializableBlob;
class SerializableMap;
class SerializableMapArray;

/// Type tags of values. The numbers are part of the interface (7, 8 and 10 are reserved). A tag
/// says how a value was made or, after a text was read, how its token looked: it never restricts
/// which of the scalar getters may read the value.
enum SerializableValueType : int {
    VALUE_TYPE_NULL = 0,
    VALUE_TYPE_UINT8 = 1,
    VALUE_TYPE_INT8 = 2,
    VALUE_TYPE_UINT16 = 3,
    VALUE_TYPE_INT16 = 4,
    VALUE_TYPE_UINT32 = 5,  ///< also what a text's token that begins with `-` is read as
    VALUE_TYPE_INT32 = 6,   ///< also what a text's token that begins with `.` is read as
    VALUE_TYPE_FLOAT = 9,   ///< also what every other unquoted token is read as
    VALUE_TYPE_BOOL = 11,   ///< also what `true`, `false` and `null` are read as
    VALUE_TYPE_STRING = 12,
    VALUE_TYPE_OBJECT = 13,
    VALUE_TYPE_ARRAY = 14,
    VALUE_TYPE_BLOB = 15,
};

/// One typed value: a scalar or a string, kept as text, or an owned map, array or blob.
///
///     SerializableValue gain(1.25f);       // text 1.250000
///     float f = 0;
///     int status = gain.getValue(f);       // 0, f is 1.25
///     int i = 0;
///     status = gain.getValue(i);           // 0, i is 1: the scan stops at the point
///
/// A number is formatted once, when the value is made, and parsed each time it is read. The tags 0,
/// 13, 14 and 15 are the container tags; every other tag, one above 15 included, is a text tag.
///
/// Values own what they hold and copy deeply: two values never share anything. Copying, writing and
/// destroying take time linear in what is held and a fixed amount of stack, however deeply maps and
/// arrays are nested.
///
/// Not synchronised: a value belongs to one thread at a time.
class ZELK_API SerializableValue {
  public:
    /// The null value: tag 0, whose text is fifty "0" characters.
    SerializableValue();

    /// Integers in decimal, without leading zeros and without a sign when positive.
    SerializableValue(const unsigned char& value);
    SerializableValue(const signed char& value);
    SerializableValue(const unsigned short& value);
    SerializableValue(const short& value);
    SerializableValue(const unsigned int& value);
    SerializableValue(const int& value);

    /// Six decimals, as `%f` gives.
    SerializableValue(const float& value);

    /// "true" or "false". Beware that a string literal converts to `bool`, not to `std::string`.
    SerializableValue(const bool& value);

    /// The string as it is, neither quoted nor checked.
    SerializableValue(const std::string& value);

    /// A value with the text and the tag given, both unchecked. A container tag makes a value that
    /// holds an empty container.
    SerializableValue(const std::string& value, int type);

    /// Deep copies of what is given.
    SerializableValue(const SerializableMap& value);
    SerializableValue(const SerializableMapArray& value);
    SerializableValue(const SerializableBlob& value);

    /// A deep copy. A copy of a value with a container tag has an empty text: so the copy of a null
    /// value is written as nothing, while the null value itself has its fifty zeros.
    SerializableValue(const SerializableValue& other);

    /// Destroys the map, array or blob held.
    virtual ~SerializableValue();

    /// Takes a deep copy of the other's contents in place of its own.
    SerializableValue& operator=(SerializableValue other);

    /// Exchanges tag, contents and text, without copying.
    void swap(SerializableValue& other);

    /// The scalar getters read the text, whatever the text tag: leading white space and an optional
    /// sign, then as much as looks like a number. They yield 0 and set `value`, or
    /// STATUS_INVALID_FORMAT and leave it alone when the tag is a container's or no number is
    /// there. An integer too large for the type is cut to its low bits. One beyond 64 bits first
    /// becomes the last that they hold, as with `sscanf`: 99999999999999999999 reads as -1 in an
    /// int, and the negative of it as 0.
    int getValue(unsigned char& value) const;
    int getValue(signed char& value) const;
    int getValue(unsigned short& value) const;
    int getValue(short& value) const;
    int getValue(unsigned int& value) const;
    int getValue(int& value) const;
    int getValue(float& value) const;

    /// False when the first five characters are "false", true when the first four are "true",
    /// in either case of letters; else STATUS_INVALID_FORMAT.
    int getValue(bool& value) const;

    /// The text; STATUS_INVALID_FORMAT for a container tag.
    int getValue(std::string& value) const;

    /// Replace what the target holds by a deep copy of the map, array or blob held;
    /// STATUS_INVALID_FORMAT, and the target as it was, when the tag is another one.
    int getValue(SerializableMap& value) const;
    int getValue(SerializableMapArray& value) const;
    int getValue(SerializableBlob& value) const;

    /// A reference to the text (`std::string`, for text tags), the owned map (`SerializableMap`) or
    /// the owned array (`SerializableMapArray`), valid until the value is assigned, swapped or
    /// destroyed. Asking for another type than the value has is fatal. There are no other
    /// specialisations than these three.
    template <typename T>
    T& getValue();

    /// The text form: a map's or array's own, `blob`, or the stored text. A string is quoted only
    /// by the map or array that it is written into.
    std::string serialize();

  private:
    friend struct ValueAccess;

    /// Takes over what is given, unchecked, and the text that `makeText` returns.
    template <typename MakeText>
    ZELK_LOCAL SerializableValue(uint32_t type, SerializableMap* map, SerializableMapArray* array,
                                 SerializableBlob* blob, MakeText makeText);

    uint32_t mType;
    SerializableMap* mMap;
    SerializableMapArray* mArray;
    SerializableBlob* mBlob;
    std::string mValue;
};

/// The three that there are.
template <>
ZELK_API std::string& SerializableValue::getValue<std::string>();
/// The three that there are.
template <>
ZELK_API SerializableMap& SerializableValue::getValue<SerializableMap>();
/// The three that there are.
template <>
ZELK_API SerializableMapArray& SerializableValue::getValue<SerializableMapArray>();

}  // namespace pemaro
