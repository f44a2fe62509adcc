// SPDX-License-Identifier: Apache-2.0

// The platform's vectors share their buffer with their copies until one is edited, and then copy it
// element by element. A reference into a map would reach its copies that way, so maps and arrays
// never copy each other's vectors and leave it at that. Conversely a vector's elements are edited
// here only where something must change: editing one that a caller shares copies it.

#define LOG_TAG "SerializableMap"

#include "values/ValueTree.h"

#include "values/ValueAccess.h"
#include "values/VectorStorage.h"
#include "values/WorkStack.h"

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
using CopySteps = WorkStack<CopyStep, 16>;

/// A container no longer held by any value.
struct Orphan {
    SerializableMap* map;
    SerializableMapArray* array;
};
using Orphans = WorkStack<Orphan, 32>;

inline bool holdsContainer(const SerializableValue& value) {
    const uint32_t type = A::type(value);
    if (type != VALUE_TYPE_OBJECT && type != VALUE_TYPE_ARRAY) return false;
    return type == VALUE_TYPE_OBJECT ? A::map(value) != nullptr : A::array(value) != nullptr;
}

/// A copy of `from`. What a container holds is left to a step.
SerializableValue copyOf(const SerializableValue& from, CopySteps& steps) {
    const uint32_t type = A::type(from);
    SerializableMap* map = nullptr;
    SerializableMapArray* array = nullptr;
    SerializableBlob* blob = nullptr;
    if (type == VALUE_TYPE_OBJECT && A::map(from) != nullptr) {
        map = new SerializableMap;
        steps.push({A::map(from), map, nullptr, nullptr});
    } else if (type == VALUE_TYPE_ARRAY && A::array(from) != nullptr) {
        array = new SerializableMapArray;
        steps.push({nullptr, nullptr, A::array(from), array});
    } else if (type == VALUE_TYPE_BLOB && A::blob(from) != nullptr) {
        blob = new SerializableBlob(*A::blob(from));
    } else if (!A::hasContainerTag(from)) {
        return A::make(type, [&]() -> const std::string& { return A::text(from); });
    }
    return A::make(type, map, array, blob);
}

void copyLevel(const SerializableMap& from, SerializableMap& to, CopySteps& steps) {
    const EntryView entries = viewOf(from);
    fillEntries(
            A::entries(to), A::size(from),
            [&](size_t i) -> const std::string& { return entries.key(i); },
            [&](size_t i) { return copyOf(entries.value(i), steps); });
}

void copyLevel(const SerializableMapArray& from, SerializableMapArray& to, CopySteps& steps) {
    const ElementView elements = viewOf(from);
    fillElements(A::elements(to), A::size(from),
                 [&](size_t i) { return copyOf(elements.value(i), steps); });
}

void runCopySteps(CopySteps& steps) {
    while (!steps.empty()) {
        const CopyStep step = steps.pop();
        if (step.fromMap != nullptr) {
            static_cast<A::DefaultEntries&>(*step.toMap) = *step.fromMap;  // for the null item
            copyLevel(*step.fromMap, *step.toMap, steps);
        } else {
            copyLevel(*step.fromArray, *step.toArray, steps);
        }
    }
}

template <typename Container>
void orphanNested(Container& container, Orphans& orphans) {
    const size_t count = A::size(container);
    const auto items = viewOf(container);
    size_t i = 0;
    while (i < count && !holdsContainer(items.value(i))) ++i;
    if (i == count) return;
    const auto editor = editorOf(container);
    for (; i < count; ++i) {
        SerializableValue& value = editor.value(i);
        if (!holdsContainer(value)) continue;
        if (A::type(value) == VALUE_TYPE_OBJECT) {
            orphans.push({std::exchange(A::map(value), nullptr), nullptr});
        } else {
            orphans.push({nullptr, std::exchange(A::array(value), nullptr)});
        }
    }
}

template <typename Container>
void destroyNestedOf(Container& container) {
    Orphans orphans;
    orphanNested(container, orphans);
    while (!orphans.empty()) {
        const Orphan orphan = orphans.pop();
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

}  // namespace pemaro
