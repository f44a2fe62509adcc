// SPDX-License-Identifier: Apache-2.0
#include "values/EntrySorter.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace pemaro {

EntrySorter::EntrySorter(const ReadEntry* entries, size_t count, const char* textEnd)
        : mEntries(entries), mCount(count), mTextEnd(textEnd), mRecords(new KeyRecord[count]) {}

/// The eight bytes of a key behind those that all keys begin with, as a number in the same order. Keys
/// have no NUL, so that what is missing of eight counts as less.
inline uint64_t EntrySorter::beginningOf(const ReadEntry& entry) const {
    std::string_view key = entry.key.text();
    key.remove_prefix(mCommon);
    uint64_t beginning = 0;
    if (mTextEnd - key.data() >= static_cast<ptrdiff_t>(sizeof(beginning))) {
        memcpy(&beginning, key.data(), sizeof(beginning));
        beginning = __builtin_bswap64(beginning);
        if (key.size() < sizeof(beginning)) beginning &= ~(~uint64_t{0} >> 8 * key.size());
    } else {
        for (size_t i = 0; i < sizeof(beginning); ++i) {
            beginning = beginning << 8 | (i < key.size() ? static_cast<unsigned char>(key[i]) : 0);
        }
    }
    return beginning;
}
static_assert(__BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__, "beginnings are read as such numbers");

/// Finds with which bytes all keys begin, and returns the bits in which their beginnings differ.
uint64_t EntrySorter::compareBeginnings() {
    const std::string_view first = mEntries[0].key.text();
    mCommon = first.size();
    uint64_t firstBeginning = 0;
    uint64_t differing = 0;
    for (size_t i = 1; i < mCount; ++i) {
        const std::string_view key = mEntries[i].key.text();
        size_t common = std::min(mCommon, key.size());
        if (memcmp(key.data(), first.data(), common) != 0) {
            common = static_cast<size_t>(
                    std::mismatch(key.begin(), key.begin() + common, first.begin()).first -
                    key.begin());
        }
        if (common != mCommon) {
            // The keys before share what now belongs to the beginnings, and differ that much later.
            const size_t less = mCommon - common;
            differing = less < sizeof(differing) ? differing >> 8 * less : 0;
            mCommon = common;
            firstBeginning = beginningOf(mEntries[0]);
        }
        differing |= beginningOf(mEntries[i]) ^ firstBeginning;
    }
    return differing;
}

/// Leaves out of each byte of the beginnings the upper bits that are the same in all of them, which
/// changes nothing in their order, and returns how many bits remain. What does not fit into a record
/// is left to the comparison of the keys.
unsigned EntrySorter::fillRecords() {
    const uint64_t differing = compareBeginnings();
    struct Piece {
        unsigned shift;
        unsigned bits;
        uint64_t mask;
    };
    Piece pieces[sizeof(uint64_t)];
    size_t count = 0;
    unsigned total = 0;
    constexpr unsigned kPrefixBits = 8 * sizeof(KeyRecord::prefix);
    for (unsigned byte = sizeof(uint64_t); byte-- != 0 && total != kPrefixBits;) {
        unsigned shift = 8 * byte;
        unsigned bits = 0;
        while (differing >> shift & 0xff & ~uint64_t{0} << bits) ++bits;
        if (bits == 0) continue;
        const unsigned over = total + bits > kPrefixBits ? total + bits - kPrefixBits : 0;
        shift += over;
        bits -= over;
        pieces[count++] = {shift, bits, (uint64_t{1} << bits) - 1};
        total += bits;
    }
    for (size_t i = 0; i < mCount; ++i) {
        const uint64_t beginning = beginningOf(mEntries[i]);
        uint64_t packed = 0;
        for (size_t p = 0; p < count; ++p) {
            packed = packed << pieces[p].bits | (beginning >> pieces[p].shift & pieces[p].mask);
        }
        mRecords[i] = {static_cast<uint32_t>(packed), static_cast<uint32_t>(i)};
    }
    return total;
}

/// Sorts the records by the `bits` lower bits of their prefixes and leaves those of equal ones in the
/// order of the text.
void EntrySorter::sortByPrefix(unsigned bits) {
    const unsigned digits = (bits + kMostDigitBits - 1) / kMostDigitBits;
    if (digits == 0) return;
    const unsigned digitBits = (bits + digits - 1) / digits;
    const uint32_t mask = (uint32_t{1} << digitBits) - 1;
    std::unique_ptr<KeyRecord[]> sorted(new KeyRecord[mCount]);
    for (unsigned digit = 0; digit < digits; ++digit) {
        const unsigned shift = digit * digitBits;
        uint32_t places[size_t{1} << kMostDigitBits];
        std::fill_n(places, mask + size_t{1}, 0);
        const KeyRecord* const begin = mRecords.get();
        const KeyRecord* const end = begin + mCount;
        for (const KeyRecord* from = begin; from != end; ++from) {
            ++places[from->prefix >> shift & mask];
        }
        uint32_t sum = 0;
        for (size_t value = 0; value <= mask; ++value) sum += std::exchange(places[value], sum);
        KeyRecord* const to = sorted.get();
        for (const KeyRecord* from = begin; from != end; ++from) {
            to[places[from->prefix >> shift & mask]++] = *from;
        }
        mRecords.swap(sorted);
    }
}

/// Sorts records of equal prefixes, those of equal keys in the order of the text.
void EntrySorter::sortByKey(KeyRecord* from, KeyRecord* to) const {
    const auto inOrder = [this](const KeyRecord& a, const KeyRecord& b) {
        const int order = restOf(a).compare(restOf(b));
        return order != 0 ? order < 0 : a.index < b.index;
    };
    // What is in order already, as many times the same key, is not sorted again.
    if (!std::is_sorted(from, to, inOrder)) std::sort(from, to, inOrder);
}

/// Sorts what the prefixes leave open, and keeps of equal keys the last.
size_t EntrySorter::sortEqualPrefixes() {
    KeyRecord* const end = mRecords.get() + mCount;
    KeyRecord* kept = mRecords.get();
    for (KeyRecord* from = mRecords.get(); from != end;) {
        KeyRecord* to = from + 1;
        if (to == end || to->prefix != from->prefix) {
            *kept++ = *from;
            from = to;
            continue;
        }
        while (to != end && to->prefix == from->prefix) ++to;
        sortByKey(from, to);
        for (; from != to; ++from) {
            if (from + 1 != to && restOf(from[0]) == restOf(from[1])) {
                mEntries[from->index].value.destroyContainer();
            } else {
                *kept++ = *from;
            }
        }
    }
    return static_cast<size_t>(kept - mRecords.get());
}

size_t EntrySorter::sort() {
    const unsigned bits = fillRecords();
    if (mCount < kFewRecords) {
        std::sort(mRecords.get(), mRecords.get() + mCount,
                  [](const KeyRecord& a, const KeyRecord& b) { return a.prefix < b.prefix; });
    } else {
        sortByPrefix(bits);
    }
    return sortEqualPrefixes();
}

}  // namespace pemaro
