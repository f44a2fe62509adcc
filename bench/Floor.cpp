// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "bench/Floor.h"

#include <utility>

#include "values/ValueAccess.h"

namespace pemaro::bench {

namespace {

using A = ValueAccess;
using Entry = android::key_value_pair_t<std::string, SerializableValue>;

/// The vector that holds a container's storage, as its base class.
android::VectorImpl& vectorOf(SerializableMap& map) {
    return reinterpret_cast<android::VectorImpl&>(A::entries(map));
}
android::VectorImpl& vectorOf(SerializableMapArray& array) {
    return reinterpret_cast<android::VectorImpl&>(A::elements(array));
}

/// Gives an empty container `count` empty items, all at once.
template <typename Item, typename Container>
Item* makeStorage(Container& container, size_t count) {
    static const Item empty{};
    android::VectorImpl& vector = vectorOf(container);
    vector.setCapacity(count);
    vector.insertAt(&empty, 0, count);
    return static_cast<Item*>(vector.editArrayImpl());
}

}  // namespace

Floor::Floor(const SerializableMap& tree) : mCount(A::size(tree)) {
    plan(tree);
}

void Floor::plan(const SerializableMap& map) {
    for (size_t i = 0; i < A::size(map); ++i)
        plan(A::entries(map).keyAt(i), A::entries(map).valueAt(i));
}

void Floor::plan(const SerializableMapArray& array) {
    for (size_t i = 0; i < A::size(array); ++i) plan({}, A::elements(array).itemAt(i));
}

void Floor::plan(std::string key, const SerializableValue& value) {
    mNodes.push_back({std::move(key), A::text(value), A::type(value), 0});
    Node& node = mNodes.back();
    if (A::type(value) == VALUE_TYPE_OBJECT) {
        node.count = A::size(*A::map(value));
        plan(*A::map(value));
    } else if (A::type(value) == VALUE_TYPE_ARRAY) {
        node.count = A::size(*A::array(value));
        plan(*A::array(value));
    }
}

void Floor::build(SerializableMap& map) const {
    build(map, mNodes.data(), mCount);
}

const Floor::Node* Floor::build(SerializableMap& map, const Node* node, size_t count) const {
    Entry* entry = makeStorage<Entry>(map, count);
    for (Entry* const end = entry + count; entry != end; ++entry) {
        entry->key = node->key;
        node = build(entry->value, node);
    }
    return node;
}

const Floor::Node* Floor::build(SerializableMapArray& array, const Node* node, size_t count) const {
    SerializableValue* value = makeStorage<SerializableValue>(array, count);
    for (SerializableValue* const end = value + count; value != end; ++value) {
        node = build(*value, node);
    }
    return node;
}

const Floor::Node* Floor::build(SerializableValue& value, const Node* node) const {
    A::type(value) = node->type;
    if (node->type == VALUE_TYPE_OBJECT) {
        A::map(value) = new SerializableMap;
        return build(*A::map(value), node + 1, node->count);
    }
    if (node->type == VALUE_TYPE_ARRAY) {
        A::array(value) = new SerializableMapArray;
        return build(*A::array(value), node + 1, node->count);
    }
    A::text(value) = node->text;
    return node + 1;
}

}  // namespace pemaro::bench
