// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <new>
#include <string>
#include <type_traits>
#include <utility>

#include "values/ValueAccess.h"

// The one place that knows how the platform's vectors hold a map's entries and an array's elements.
//
// Through its public operations a keyed vector can only be filled entry by entry: each `add` searches
// for the place of a key, copies the pair twice and moves what stands behind it, and each look at an
// entry is checked. What a reader needs is a storage of known size whose items are made where they
// will stay. The base class of all these vectors, VectorImpl, offers that in public: RawVector makes
// an untyped storage of `count` items of the right size, the items are constructed in it, and
// VectorImpl's assignment lets the map's vector share it, after which RawVector gives its own share
// up. From then on the storage is like any other of that vector.
//
// This relies on what the platform calls "set in stone" in VectorImpl.h, and what holds alike in
// libutils of Android 10 to 15:
//
//   - KeyedVector has one member, a SortedVector, and that and Vector have VectorImpl as their first
//     base and add no member: each of them is a VectorImpl at the same address. (The platform itself
//     casts a SortedVector so, in its merge().) DefaultKeyedVector adds the null item behind it.
//   - VectorImpl::operator= shares the storage of another vector whose items have the same size, and
//     VectorImpl::insertAt without an item constructs nothing where HAS_TRIVIAL_CTOR is given.
//   - Items lie one behind the other from arrayImpl() on, aligned to 8 bytes.
//
// The sizes are checked below. With ZELK_PLAIN_VECTORS the same operations are made of the vectors'
// public ones alone, for a platform on which that does not hold; the tests run both.

namespace pemaro {

using MapEntries = ValueAccess::Entries;
using ArrayElements = ValueAccess::Elements;

#ifdef ZELK_PLAIN_VECTORS

/// The items of a container, to look at: valid until it is changed. Indices are not checked.
class EntryView {
  public:
    explicit EntryView(const SerializableMap& map) : mEntries(&ValueAccess::entries(map)) {}
    const std::string& key(size_t index) const { return mEntries->keyAt(index); }
    const SerializableValue& value(size_t index) const { return mEntries->valueAt(index); }

  private:
    const MapEntries* mEntries;
};

class ElementView {
  public:
    explicit ElementView(const SerializableMapArray& array)
            : mElements(&ValueAccess::elements(array)) {}
    const SerializableValue& value(size_t index) const { return mElements->itemAt(index); }

  private:
    const ArrayElements* mElements;
};

/// The same, to be changed in place. Making one gives a container that shares its items a copy of
/// its own.
class EntryEditor {
  public:
    explicit EntryEditor(SerializableMap& map) : mEntries(&ValueAccess::entries(map)) {}
    const std::string& key(size_t index) const { return mEntries->keyAt(index); }
    SerializableValue& value(size_t index) const { return mEntries->editValueAt(index); }
    const std::string& takeKey(size_t index) const { return key(index); }

  private:
    MapEntries* mEntries;
};

class ElementEditor {
  public:
    explicit ElementEditor(SerializableMapArray& array)
            : mElements(&ValueAccess::elements(array)) {}
    SerializableValue& value(size_t index) const { return mElements->editItemAt(index); }

  private:
    ArrayElements* mElements;
};

/// Replaces the contents of `to` by `count` entries, made of `keyAt(i)` and `valueAt(i)`, which are
/// called in turn. The keys come in ascending order.
template <typename KeyAt, typename ValueAt>
void fillEntries(MapEntries& to, size_t count, KeyAt keyAt, ValueAt valueAt) {
    const SerializableValue empty{std::string(), VALUE_TYPE_NULL};
    MapEntries entries;
    entries.setCapacity(count);
    for (size_t i = 0; i < count; ++i) {
        entries.add(std::string(keyAt(i)), empty);
        SerializableValue value(valueAt(i));
        entries.editValueAt(i).swap(value);
    }
    to = entries;
}

/// Replaces the contents of `to` by `count` elements, made of `valueAt(i)` in turn.
template <typename ValueAt>
void fillElements(ArrayElements& to, size_t count, ValueAt valueAt) {
    const SerializableValue empty{std::string(), VALUE_TYPE_NULL};
    ArrayElements elements;
    elements.setCapacity(count);
    elements.insertAt(empty, 0, count);
    for (size_t i = 0; i < count; ++i) {
        SerializableValue value(valueAt(i));
        elements.editItemAt(i).swap(value);
    }
    to = elements;
}

/// What the map yields for a key that it lacks.
inline const SerializableValue& nullItem(const SerializableMap& map, const std::string& absentKey) {
    return map.valueFor(absentKey);
}

#else

/// A platform vector's storage whose items are neither constructed, copied nor destroyed by it.
template <typename Item>
class RawVector final : public android::VectorImpl {
  public:
    explicit RawVector(size_t count)
            : VectorImpl(sizeof(Item), HAS_TRIVIAL_CTOR | HAS_TRIVIAL_DTOR | HAS_TRIVIAL_COPY) {
        if (count == 0) return;
        setCapacity(count);
        insertAt(size_t{0}, count);
    }
    ~RawVector() override { finish_vector(); }

    /// Where the items are to be constructed.
    Item* room() { return static_cast<Item*>(editArrayImpl()); }

  protected:
    void do_construct(void*, size_t) const override {}
    void do_destroy(void*, size_t) const override {}
    void do_copy(void*, const void*, size_t) const override {}
    void do_splat(void*, const void*, size_t) const override {}
    void do_move_forward(void*, const void*, size_t) const override {}
    void do_move_backward(void*, const void*, size_t) const override {}
};

using MapEntry = android::key_value_pair_t<std::string, SerializableValue>;

struct VectorLayout {
    using Sorted = android::SortedVector<MapEntry>;
    static_assert(std::is_base_of_v<android::VectorImpl, Sorted>);
    static_assert(std::is_base_of_v<android::VectorImpl, ArrayElements>);
    static_assert(sizeof(Sorted) == sizeof(android::VectorImpl));
    static_assert(sizeof(ArrayElements) == sizeof(android::VectorImpl));
    static_assert(sizeof(MapEntries) == sizeof(Sorted));
    static_assert(sizeof(ValueAccess::DefaultEntries) ==
                  sizeof(MapEntries) + sizeof(SerializableValue));
    static_assert(sizeof(MapEntry) == sizeof(std::string) + sizeof(SerializableValue));
    static_assert(alignof(MapEntry) <= 8 && alignof(SerializableValue) <= 8);

    static android::VectorImpl& of(MapEntries& entries) {
        return reinterpret_cast<android::VectorImpl&>(entries);
    }
    static const android::VectorImpl& of(const MapEntries& entries) {
        return reinterpret_cast<const android::VectorImpl&>(entries);
    }
    static android::VectorImpl& of(ArrayElements& elements) {
        return reinterpret_cast<android::VectorImpl&>(elements);
    }
};

/// The items of a container, to look at: valid until it is changed. Indices are not checked.
class EntryView {
  public:
    explicit EntryView(const SerializableMap& map)
            : mEntries(static_cast<const MapEntry*>(
                      VectorLayout::of(ValueAccess::entries(map)).arrayImpl())) {}
    const std::string& key(size_t index) const { return mEntries[index].key; }
    const SerializableValue& value(size_t index) const { return mEntries[index].value; }

  private:
    const MapEntry* mEntries;
};

class ElementView {
  public:
    explicit ElementView(const SerializableMapArray& array)
            : mElements(ValueAccess::elements(array).array()) {}
    const SerializableValue& value(size_t index) const { return mElements[index]; }

  private:
    const SerializableValue* mElements;
};

/// The same, to be changed in place. Making one gives a container that shares its items a copy of
/// its own.
class EntryEditor {
  public:
    explicit EntryEditor(SerializableMap& map)
            : mEntries(static_cast<MapEntry*>(
                      VectorLayout::of(ValueAccess::entries(map)).editArrayImpl())) {}
    const std::string& key(size_t index) const { return mEntries[index].key; }
    SerializableValue& value(size_t index) const { return mEntries[index].value; }
    /// For the last use of an entry whose map is about to be emptied.
    std::string&& takeKey(size_t index) const { return std::move(mEntries[index].key); }

  private:
    MapEntry* mEntries;
};

class ElementEditor {
  public:
    explicit ElementEditor(SerializableMapArray& array)
            : mElements(ValueAccess::elements(array).editArray()) {}
    SerializableValue& value(size_t index) const { return mElements[index]; }

  private:
    SerializableValue* mElements;
};

/// Replaces the contents of `to` by `count` entries, made of `keyAt(i)` and `valueAt(i)`, which are
/// called in turn. The keys come in ascending order.
template <typename KeyAt, typename ValueAt>
void fillEntries(MapEntries& to, size_t count, KeyAt keyAt, ValueAt valueAt) {
    RawVector<MapEntry> storage(count);
    MapEntry* const entries = storage.room();
    for (size_t i = 0; i < count; ++i) {
        new (&entries[i].key) std::string(keyAt(i));
        new (&entries[i].value) SerializableValue(valueAt(i));
    }
    VectorLayout::of(to) = storage;
}

/// Replaces the contents of `to` by `count` elements, made of `valueAt(i)` in turn.
template <typename ValueAt>
void fillElements(ArrayElements& to, size_t count, ValueAt valueAt) {
    RawVector<SerializableValue> storage(count);
    SerializableValue* const elements = storage.room();
    for (size_t i = 0; i < count; ++i) new (elements + i) SerializableValue(valueAt(i));
    VectorLayout::of(to) = storage;
}

/// What the map yields for a key that it lacks.
inline const SerializableValue& nullItem(const SerializableMap& map, const std::string&) {
    const ValueAccess::DefaultEntries& entries = map;
    return *reinterpret_cast<const SerializableValue*>(reinterpret_cast<const char*>(&entries) +
                                                       sizeof(MapEntries));
}

#endif

inline EntryView viewOf(const SerializableMap& map) {
    return EntryView(map);
}
inline ElementView viewOf(const SerializableMapArray& array) {
    return ElementView(array);
}
inline EntryEditor editorOf(SerializableMap& map) {
    return EntryEditor(map);
}
inline ElementEditor editorOf(SerializableMapArray& array) {
    return ElementEditor(array);
}

}  // namespace pemaro
