// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <iosfwd>
#include <string>
#include <utility>
#include <vector>

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"

namespace pemaro::reference {

/// A value as plain data, to compare with: tag and text, and the contents of a map or an array.
struct Tree {
    int type = 0;
    std::string text;
    std::vector<std::pair<std::string, Tree>> entries;
    std::vector<Tree> elements;
};

bool operator==(const Tree& a, const Tree& b);
std::ostream& operator<<(std::ostream& out, const Tree& tree);

/// What a map or an array holds.
Tree treeOf(const SerializableMap& map);
Tree treeOf(const SerializableMapArray& array);

/// The text form, written the plain way: a value at a time, recursively.
std::string writeTree(const Tree& tree);

}  // namespace pemaro::reference
