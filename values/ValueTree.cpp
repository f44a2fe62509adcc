// SPDX-License-Identifier: Apache-2.0

// The platform's vectors share their buffer with their copies until one is edited, and then copy it
// element by element. A reference into a map would reach its copies that way, so maps and arrays
// never copy each other's vectors and leave it at that. Conversely a vector's elements are edited
// here only where something must change: editing one that a caller shares copies it.

#define LOG_TAG "SerializableMap"

#include "values/ValueTree.h"

#include <vector>

#include "values/ValueAccess.h"

namespace pemaro {

namespace {

using A = ValueAccess;

/// A container to fill and the one that it is filled from: two maps or two arrays.
struct CopyStep {
    const SerializableMap* fromMap;
    SerializableMap* toMap;
    const SerializableMapArray* fromArray;
    SerializableMapArray* toArray;
};
using CopySteps = std::vector<CopyStep>;

/// A container no longer held by any value.
struct Orphan {
    SerializableMap* map;
    SerializableMapArray* array;
};
using Orphans = std::vector<Orphan>;

bool holdsContainer(const SerializableValue& value) {
    return (A::type(value) == VALUE_TYPE_OBJECT && A::map(value) != nullptr) ||
           (A::type(value) == VALUE_TYPE_ARRAY && A::array(value) != nullptr);
}

template <typename Container>
bool isFlat(const Container& container) {
    for (size_t i = 0; i < A::size(container); ++i) {
        if (holdsContainer(A::at(container, i))) return false;
    }
    return true;
}

/// Makes `to` hold no entries, and the null item of `from`.
void adoptNullItem(const SerializableMap& from, SerializableMap& to) {
    static_cast<A::DefaultEntries&>(to) = from;
    A::entries(to) = A::Entries();
}

// A copy of a flat container first shares its buffer. Editing an element then makes the platform copy
// all of them at once, without the cost of inserting them one by one.

void copyFlat(const SerializableMap& from, SerializableMap& to) {
    static_cast<A::DefaultEntries&>(to) = from;
    A::entries(to).editValueAt(0);
}

void copyFlat(const SerializableMapArray& from, SerializableMapArray& to) {
    A::elements(to) = A::elements(from);
    A::elements(to).editItemAt(0);
}

void copyKeys(const SerializableMap& from, SerializableMap& to) {
    adoptNullItem(from, to);
    appendEmpty(to, A::size(from), [&from](size_t i) { return A::entries(from).keyAt(i); });
}

void copyKeys(const SerializableMapArray& from, SerializableMapArray& to) {
    appendEmpty(to, A::size(from));
}

/// Gives `to`, a null value, a new container of the kind that `from` holds, to be filled later.
void copyShell(const SerializableValue& from, SerializableValue& to, CopySteps& steps) {
    A::type(to) = A::type(from);
    if (A::type(from) == VALUE_TYPE_OBJECT) {
        A::map(to) = new SerializableMap;
        steps.push_back({A::map(from), A::map(to), nullptr, nullptr});
    } else {
        A::array(to) = new SerializableMapArray;
        steps.push_back({nullptr, nullptr, A::array(from), A::array(to)});
    }
}

template <typename Container>
void copyLevel(const Container& from, Container& to, CopySteps& steps) {
    const size_t count = A::size(from);
    if (count != 0 && isFlat(from)) return copyFlat(from, to);
    copyKeys(from, to);
    for (size_t i = 0; i < count; ++i) {
        const SerializableValue& value = A::at(from, i);
        if (holdsContainer(value)) {
            copyShell(value, A::edit(to, i), steps);
        } else {
            SerializableValue copy(value);
            A::edit(to, i).swap(copy);
        }
    }
}

void runCopySteps(CopySteps& steps) {
    while (!steps.empty()) {
        const CopyStep step = steps.back();
        steps.pop_back();
        if (step.fromMap != nullptr) {
            copyLevel(*step.fromMap, *step.toMap, steps);
        } else {
            copyLevel(*step.fromArray, *step.toArray, steps);
        }
    }
}

template <typename Container>
void orphanNested(Container& container, Orphans& orphans) {
    for (size_t i = 0; i < A::size(container); ++i) {
        if (!holdsContainer(A::at(container, i))) continue;
        SerializableValue& value = A::edit(container, i);
        if (A::type(value) == VALUE_TYPE_OBJECT) {
            orphans.push_back({A::map(value), nullptr});
            A::map(value) = nullptr;
        } else {
            orphans.push_back({nullptr, A::array(value)});
            A::array(value) = nullptr;
        }
    }
}

template <typename Container>
void destroyNestedOf(Container& container) {
    Orphans orphans;
    orphanNested(container, orphans);
    while (!orphans.empty()) {
        const Orphan orphan = orphans.back();
        orphans.pop_back();
        if (orphan.map != nullptr) {
            orphanNested(*orphan.map, orphans);
            delete orphan.map;
        } else {
            orphanNested(*orphan.array, orphans);
            delete orphan.array;
        }
    }
}

}  // namespace

const SerializableValue& defaultValue() {
    static const SerializableValue value;
    return value;
}

namespace {
/// Makes the default value at load, before any thread can ask for it.
[[maybe_unused]] const SerializableValue& gDefaultValue = defaultValue();
}  // namespace

void copyTree(const SerializableMap& from, SerializableMap& to) {
    CopySteps steps;
    copyLevel(from, to, steps);
    runCopySteps(steps);
}

void copyTree(const SerializableMapArray& from, SerializableMapArray& to) {
    CopySteps steps;
    copyLevel(from, to, steps);
    runCopySteps(steps);
}

void moveTree(SerializableMap& from, SerializableMap& to) {
    static_cast<A::DefaultEntries&>(to) = from;
    A::entries(from) = A::Entries();
}

void moveTree(SerializableMapArray& from, SerializableMapArray& to) {
    A::elements(to) = A::elements(from);
    A::elements(from) = A::Elements();
}

void destroyNested(SerializableMap& map) {
    destroyNestedOf(map);
}

void destroyNested(SerializableMapArray& array) {
    destroyNestedOf(array);
}

void appendEmpty(SerializableMapArray& array, size_t count) {
    A::elements(array).setCapacity(count);
    A::elements(array).insertAt(defaultValue(), 0, count);
}

}  // namespace pemaro
