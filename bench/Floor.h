// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "pemaro/SerializableMap.h"

namespace pemaro::bench {

/// The least that any reader has to do for a tree: the same maps, arrays and values made, each
/// container's storage at once, and the texts assigned in place. What there is to make is known
/// beforehand: nothing is searched, sorted or compared.
class Floor {
  public:
    explicit Floor(const SerializableMap& tree);

    /// Makes the tree in `map`, which is empty.
    void build(SerializableMap& map) const;

  private:
    struct Node {
        std::string key;
        std::string text;
        unsigned type;
        size_t count;  ///< of a container: its entries or elements, which follow
    };

    void plan(const SerializableMap& map);
    void plan(const SerializableMapArray& array);
    void plan(std::string key, const SerializableValue& value);
    const Node* build(SerializableMap& map, const Node* node, size_t count) const;
    const Node* build(SerializableMapArray& array, const Node* node, size_t count) const;
    const Node* build(SerializableValue& value, const Node* node) const;

    std::vector<Node> mNodes;
    size_t mCount;
};

}  // namespace pemaro::bench
