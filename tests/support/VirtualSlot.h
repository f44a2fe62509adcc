// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace pemaro::test {

// Callers are compiled against the numbers of virtual slots, so tests ask for them. A pointer to a
// virtual member holds the byte offset of its slot in the table of virtual functions: plus one in
// its first word, or, on Arm, as it is, with the lowest bit of the second word set.

#if defined(__aarch64__) || defined(__arm__)
constexpr bool kVirtualBitInAdjustment = true;
#else
constexpr bool kVirtualBitInAdjustment = false;
#endif

/// The slot of a virtual member, counted from 0 over all virtual functions of its class; -1 for a
/// member that is not virtual.
template <typename Member>
int slotOf(Member member) {
    struct {
        uintptr_t pointer;
        uintptr_t adjustment;
    } words;
    static_assert(sizeof(words) == sizeof(member), "a pointer to a member is two words");
    memcpy(&words, &member, sizeof(words));
    const uintptr_t mark = kVirtualBitInAdjustment ? words.adjustment : words.pointer;
    if ((mark & 1) == 0) {
        return -1;
    }
    const uintptr_t offset = kVirtualBitInAdjustment ? words.pointer : words.pointer - 1;
    return static_cast<int>(offset / sizeof(void*));
}

/// The member at a slot, whatever its name: `(object.*memberAt<int (Foo::*)()>(6))()` calls it.
template <typename Member>
Member memberAt(int slot) {
    const uintptr_t offset = static_cast<uintptr_t>(slot) * sizeof(void*);
    const uintptr_t words[2] = {kVirtualBitInAdjustment ? offset : offset + 1,
                                kVirtualBitInAdjustment ? uintptr_t{1} : uintptr_t{0}};
    Member member;
    static_assert(sizeof(words) == sizeof(member), "a pointer to a member is two words");
    memcpy(&member, words, sizeof(words));
    return member;
}

}  // namespace pemaro::test
