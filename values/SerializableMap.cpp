// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "pemaro/SerializableMap.h"

#include <vector>

#include "pemaro/Status.h"
#include "values/TextWriter.h"
#include "values/TreeReader.h"
#include "values/ValueAccess.h"
#include "values/ValueTree.h"

namespace pemaro {

namespace {

using Entries = ValueAccess::Entries;

/// Moves the values at `positions` of `from`, whose keys `to` lacks, into `to`, between its own.
void mergeNew(SerializableMap& to, Entries& from, const std::vector<size_t>& positions) {
    Entries& own = to;
    Entries merged;
    merged.setCapacity(own.size() + positions.size());
    const auto append = [&merged](Entries& source, size_t index) {
        const ssize_t at = merged.add(source.keyAt(index), defaultValue());
        merged.editValueAt(static_cast<size_t>(at)).swap(source.editValueAt(index));
    };
    size_t next = 0;
    for (const size_t position : positions) {
        for (; next < own.size() && own.keyAt(next) < from.keyAt(position); ++next) {
            append(own, next);
        }
        append(from, position);
    }
    for (; next < own.size(); ++next) append(own, next);
    own = merged;
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
    return static_cast<int>(ValueAccess::type(valueFor(key)));
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
    return indexOfKey(key) >= 0;
}

bool SerializableMap::contains(const char* key) {
    return contains(std::string(key));
}

SerializableMap& SerializableMap::operator+=(const SerializableMap& other) {
    // A copy, for `other` may be this map or be held by one of its values.
    SerializableMap copy(other);
    Entries& incoming = copy;
    std::vector<size_t> absent;
    for (size_t i = 0; i < incoming.size(); ++i) {
        const ssize_t at = indexOfKey(incoming.keyAt(i));
        if (at < 0) {
            absent.push_back(i);
        } else {
            editValueAt(static_cast<size_t>(at)).swap(incoming.editValueAt(i));
        }
    }
    if (!absent.empty()) mergeNew(*this, incoming, absent);
    return *this;
}

SerializableMap SerializableMap::operator+(const SerializableMap& other) const {
    SerializableMap sum(*this);
    sum += other;
    return sum;
}

int SerializableMap::clear() {
    static_cast<Entries&>(*this) = Entries();
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
