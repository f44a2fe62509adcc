// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"
#include "pemaro/SerializableValue.h"

#include <utils/KeyedVector.h>
#include <string>

namespace pemaro {

/// A map from strings to values, sorted by key in ascending byte order: the payload of every map
/// that crosses Binder, where it travels as text (docs/text-format.md tells the format).
///
///     SerializableMap map;
///     map.add("count", 3);
///     map.add("name", std::string("pen"));
///     std::string text = map.serialize();       // {"count":3,"name":"pen"}
///
///     SerializableMap copy;
///     int status = copy.unserialize(text);      // 0
///     std::string name = copy.editValueFor("name").getValue<std::string>();
///
/// Entries are added with the keyed vector's own `add` (which replaces the value of a key that is
/// there) and `replaceValueFor`, and reached with `indexOfKey`, `size`, `editValueFor` (fatal for
/// an absent key) and `valueFor`, which yields the null item, a null value, for an absent key.
///
/// A large map is best built with `setCapacity` first and then `add` in ascending order of the keys:
/// the entries lie sorted in one block, which `add` moves up behind a key that comes in between, so
/// that many keys in any other order take quadratic time. Reading a text and `+=` need no such care.
///
/// Copies of a map share nothing. A copy made of the base class alone is the platform's: it shares
/// its entries with the map until either is edited.
///
/// Not synchronised: a map belongs to one thread at a time.
class ZELK_API SerializableMap
        : public android::DefaultKeyedVector<std::string, SerializableValue> {
  public:
    /// Makes an empty map or a deep copy of another, and destroys the entries.
    SerializableMap();
    SerializableMap(const SerializableMap& other);
    virtual ~SerializableMap();

    /// Replaces the entries by deep copies of the other's.
    SerializableMap& operator=(const SerializableMap& other);

    /// The tag of the value under `key`; for an absent key that of the null item, VALUE_TYPE_NULL.
    int getType(const std::string& key);

    /// Copies the key at the sorted position `index`; STATUS_BAD_PARAMETER, and `key` as it was,
    /// when there is no such position.
    int keyAt(unsigned long index, std::string& key);

    /// Copies the value at the sorted position `index`; STATUS_BAD_PARAMETER, and `value` as it
    /// was, when there is no such position.
    int valueAt(unsigned long index, SerializableValue& value);

    /// Whether an entry has exactly this key. Allocates nothing, as getType(); the keyed vector's own
    /// `indexOfKey` and `valueFor` make a pair of the key and a value to look for.
    bool contains(const std::string& key);
    bool contains(const char* key);

    /// Merges in copies of `other`'s entries, in time linear in both; where both have a key, `other`'s
    /// value wins.
    SerializableMap& operator+=(const SerializableMap& other);

    /// A new map: this one's entries with `other`'s merged in as by `+=`.
    SerializableMap operator+(const SerializableMap& other) const;

    /// Removes all entries and returns 0.
    int clear();

    /// The text form.
    std::string serialize() const;

    /// Replaces the entries, all of them, by what `text` holds, up to its first NUL if it has one.
    /// Returns 0, or STATUS_INVALID_FORMAT after logging the reason, and then the map is as it was.
    /// A scalar without any text, as in `{"a": ,"b":1}`, is fatal. Takes time and memory linear in
    /// the length of the text and a fixed amount of stack; keys that do not come in ascending order
    /// are sorted besides, which may compare each with the logarithm of their number of others.
    int unserialize(const std::string& text);

  private:
    friend struct ValueAccess;
};

}  // namespace pemaro
