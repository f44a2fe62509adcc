// SPDX-License-Identifier: Apache-2.0
#include "tests/values/reference/ReferenceTree.h"

#include <ostream>

#include "values/ValueAccess.h"

namespace pemaro::reference {

bool operator==(const Tree& a, const Tree& b) {
    return a.type == b.type && a.text == b.text && a.entries == b.entries &&
           a.elements == b.elements;
}

std::ostream& operator<<(std::ostream& out, const Tree& tree) {
    out << tree.type << '(' << tree.text;
    for (const auto& [key, value] : tree.entries) out << ' ' << key << '=' << value;
    for (const Tree& element : tree.elements) out << ' ' << element;
    return out << ')';
}

namespace {

// A value that was made of a text and a container's tag holds no container, which is an empty one.
template <typename Container>
Tree treeOfHeld(const Container* held) {
    return reference::treeOf(held != nullptr ? *held : Container());
}

Tree treeOf(const SerializableValue& value) {
    Tree tree;
    switch (ValueAccess::type(value)) {
        case VALUE_TYPE_OBJECT:
            return treeOfHeld(ValueAccess::map(value));
        case VALUE_TYPE_ARRAY:
            return treeOfHeld(ValueAccess::array(value));
        default:
            tree.type = static_cast<int>(ValueAccess::type(value));
            tree.text = ValueAccess::text(value);
            return tree;
    }
}

std::string writeQuotedOrNot(const Tree& tree) {
    const std::string text = writeTree(tree);
    return tree.type == VALUE_TYPE_STRING ? "\"" + text + "\"" : text;
}

}  // namespace

Tree treeOf(const SerializableMap& map) {
    Tree tree;
    tree.type = VALUE_TYPE_OBJECT;
    for (size_t i = 0; i < map.size(); ++i) {
        tree.entries.emplace_back(map.KeyedVector::keyAt(i), treeOf(map.KeyedVector::valueAt(i)));
    }
    return tree;
}

Tree treeOf(const SerializableMapArray& array) {
    Tree tree;
    tree.type = VALUE_TYPE_ARRAY;
    for (size_t i = 0; i < ValueAccess::size(array); ++i) {
        tree.elements.push_back(treeOf(array.get(i)));
    }
    return tree;
}

std::string writeTree(const Tree& tree) {
    std::string text;
    switch (tree.type) {
        case VALUE_TYPE_OBJECT:
            for (const auto& [key, value] : tree.entries) {
                text += (text.empty() ? "" : ",") + ("\"" + key + "\":") + writeQuotedOrNot(value);
            }
            return "{" + text + "}";
        case VALUE_TYPE_ARRAY:
            for (size_t i = 0; i < tree.elements.size(); ++i) {
                text += (i == 0 ? "" : ",") + writeQuotedOrNot(tree.elements[i]);
            }
            return "[" + text + "]";
        case VALUE_TYPE_BLOB:
            return "blob";
        case VALUE_TYPE_NULL:
            return "";
        default:
            return tree.text;
    }
}

}  // namespace pemaro::reference
