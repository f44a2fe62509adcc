// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "pemaro/SerializableMap.h"

#include <algorithm>
#include <string_view>

#include "pemaro/Status.h"
#include "values/TextWriter.h"
#include "values/TreeReader.h"
#include "values/ValueAccess.h"
#include "values/ValueTree.h"
#include "values/VectorStorage.h"
#include "values/WorkStack.h"

namespace pemaro {

namespace {

/// Where `key` is in `map`, or where it would have to be.
struct Place {
    size_t index;
    bool found;
};

/// Looks in [from, end), where `key` has to be if anywhere.
Place find(const SerializableMap& map, std::string_view key, size_t from, size_t end) {
    const EntryView entries = viewOf(map);
    while (from < end) {
        const size_t middle = from + (end - from) / 2;
        const int order = key.compare(entries.key(middle));
        if (order == 0) return {middle, true};
        if (order < 0) {
            end = middle;
        } else {
            from = middle + 1;
        }
    }
    return {from, false};
}

Place find(const SerializableMap& map, std::string_view key) {
    return find(map, key, 0, ValueAccess::size(map));
}

/// Looks in [from, map.size()), fast where the key is close to `from`: one, two, four … entries ahead first.
Place findAhead(const SerializableMap& map, std::string_view key, size_t from) {
    const EntryView entries = viewOf(map);
    const size_t size = ValueAccess::size(map);
    size_t end = from;
    for (size_t step = 1; end < size && key > entries.key(end); step *= 2) {
        from = end + 1;
        end = from + step;
    }
    return find(map, key, from, std::min(end + 1, size));
}

/// An entry that a map lacks: the index it has in the other one, and the one it will stand before.
struct Absent {
    size_t incoming;
    size_t before;
};
using Absents = WorkStack<Absent, 16>;

/// Moves the `absent` entries of `from` into `to`, between its own.
void mergeAbsent(SerializableMap& to, SerializableMap& from, Absents& absents) {
    const EntryEditor own = editorOf(to);
    const EntryEditor incoming = editorOf(from);
    const Absent* absent = absents.begin();
    size_t next = 0;
    const auto isIncoming = [&] { return absent != absents.end() && absent->before == next; };
    ValueAccess::Entries merged;
    fillEntries(
            merged, ValueAccess::size(to) + absents.size(),
            [&](size_t) {
                // NOLINTNEXTLINE(clang-analyzer-cplusplus.Move): each entry is taken once
                return isIncoming() ? incoming.takeKey(absent->incoming) : own.takeKey(next);
            },
            [&](size_t) {
                return ValueAccess::take(isIncoming() ? incoming.value(absent++->incoming)
                                                      : own.value(next++));
            });
    ValueAccess::entries(to) = merged;
}

}  // namespace

SerializableMap::SerializableMap() : DefaultKeyedVector(defaultValue()) {}

SerializableMap::SerializableMap(const SerializableMap& other) : DefaultKeyedVector(other) {
    copyTree(other, *this);
}

SerializableMap::~SerializableMap() {
    destroyNested(*this);
}

SerializableMap& SerializableMap::operator=(const SerializableMap& other) {
    SerializableMap copy(other);
    moveTree(copy, *this);
    return *this;
}

int SerializableMap::getType(const std::string& key) {
    const Place place = find(*this, key);
    return static_cast<int>(ValueAccess::type(place.found ? viewOf(*this).value(place.index)
                                                          : nullItem(*this, key)));
}

int SerializableMap::keyAt(unsigned long index, std::string& key) {
    if (index >= size()) return STATUS_BAD_PARAMETER;
    key = KeyedVector::keyAt(index);
    return STATUS_NO_ERROR;
}

int SerializableMap::valueAt(unsigned long index, SerializableValue& value) {
    if (index >= size()) return STATUS_BAD_PARAMETER;
    value = KeyedVector::valueAt(index);
    return STATUS_NO_ERROR;
}

bool SerializableMap::contains(const std::string& key) {
    return find(*this, key).found;
}

bool SerializableMap::contains(const char* key) {
    return find(*this, key).found;
}

SerializableMap& SerializableMap::operator+=(const SerializableMap& other) {
    // A copy, for `other` may be this map or be held by one of its values.
    SerializableMap copy(other);
    const EntryEditor incoming = editorOf(copy);
    const EntryEditor own = editorOf(*this);
    Absents absents;
    Place place = {0, false};
    for (size_t i = 0; i < copy.size(); ++i) {
        place = findAhead(*this, incoming.key(i), place.index);
        if (place.found) {
            own.value(place.index++).swap(incoming.value(i));
        } else {
            absents.push({i, place.index});
        }
    }
    if (!absents.empty()) mergeAbsent(*this, copy, absents);
    return *this;
}

SerializableMap SerializableMap::operator+(const SerializableMap& other) const {
    SerializableMap sum(*this);
    sum += other;
    return sum;
}

int SerializableMap::clear() {
    ValueAccess::entries(*this) = ValueAccess::Entries();
    return STATUS_NO_ERROR;
}

std::string SerializableMap::serialize() const {
    return writeText(*this);
}

int SerializableMap::unserialize(const std::string& text) {
    SerializableMap result;
    if (!TreeReader(text.c_str()).read(result)) return STATUS_INVALID_FORMAT;
    moveTree(result, *this);
    return STATUS_NO_ERROR;
}

}  // namespace pemaro
