// SPDX-License-Identifier: Apache-2.0
#include "values/EntrySorter.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace pemaro {

inline uint64_t EntrySorter::prefixOf(std::string_view key) const {
    key.remove_prefix(mCommon);
    uint64_t prefix = 0;
    if (mTextEnd - key.data() >= static_cast<ptrdiff_t>(sizeof(prefix))) {
        memcpy(&prefix, key.data(), sizeof(prefix));
        prefix = __builtin_bswap64(prefix);
        if (key.size() < sizeof(prefix)) prefix &= ~(~uint64_t{0} >> 8 * key.size());
    } else {
        for (size_t i = 0; i < sizeof(prefix); ++i) {
            prefix = prefix << 8 | (i < key.size() ? static_cast<unsigned char>(key[i]) : 0);
        }
    }
    return prefix;
}
static_assert(__BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__, "prefixes are read as such numbers");

EntrySorter::EntrySorter(const ReadEntry* entries, size_t count, const char* textEnd)
        : mEntries(entries),
          mCount(count),
          mTextEnd(textEnd),
          mCommon(commonPrefix()),
          mRecords(new KeyRecord[count]) {
    const uint64_t first = prefixOf(entries[0].key.text());
    for (size_t i = 0; i < count; ++i) {
        mRecords[i] = {prefixOf(entries[i].key.text()), i};
        mDiffering |= mRecords[i].prefix ^ first;
    }
}

size_t EntrySorter::commonPrefix() const {
    const std::string_view first = mEntries[0].key.text();
    size_t common = first.size();
    for (size_t i = 1; i < mCount && common != 0; ++i) {
        const std::string_view key = mEntries[i].key.text();
        common = std::min(common, key.size());
        if (memcmp(key.data(), first.data(), common) == 0) continue;
        common = static_cast<size_t>(
                std::mismatch(key.begin(), key.begin() + common, first.begin()).first -
                key.begin());
    }
    return common;
}

std::string_view EntrySorter::restOf(const KeyRecord& record) const {
    const std::string_view key = keyOf(record);
    return key.substr(std::min(key.size(), mCommon + sizeof(record.prefix)));
}

bool EntrySorter::less(const KeyRecord& a, const KeyRecord& b) const {
    if (a.prefix != b.prefix) return a.prefix < b.prefix;
    const int order = restOf(a).compare(restOf(b));
    return order != 0 ? order < 0 : a.index < b.index;
}

void EntrySorter::sort(KeyRecord* from, KeyRecord* to) const {
    const auto inOrder = [this](const KeyRecord& a, const KeyRecord& b) { return less(a, b); };
    // What is in order already, as many times the same key, is not sorted again.
    if (!std::is_sorted(from, to, inOrder)) std::sort(from, to, inOrder);
}

/// Leaves out of each byte of the prefixes the upper bits that are the same in all of them, which
/// changes nothing in their order, and returns how many bits remain.
unsigned EntrySorter::packPrefixes() {
    struct Piece {
        unsigned shift;
        unsigned bits;
        uint64_t mask;
    };
    Piece pieces[sizeof(uint64_t)];
    size_t count = 0;
    unsigned total = 0;
    for (unsigned shift = 64; shift != 0;) {
        shift -= 8;
        unsigned bits = 0;
        while (mDiffering >> shift & 0xff & ~uint64_t{0} << bits) ++bits;
        if (bits == 0) continue;
        pieces[count++] = {shift, bits, (uint64_t{1} << bits) - 1};
        total += bits;
    }
    KeyRecord* const end = mRecords.get() + mCount;
    for (KeyRecord* record = mRecords.get(); record != end; ++record) {
        uint64_t packed = 0;
        for (size_t p = 0; p < count; ++p) {
            packed =
                    packed << pieces[p].bits | (record->prefix >> pieces[p].shift & pieces[p].mask);
        }
        record->prefix = packed;
    }
    return total;
}

/// Sorts the records by their prefixes and leaves those of equal ones in the order of the text.
void EntrySorter::sortByPrefix() {
    const unsigned bits = packPrefixes();
    std::unique_ptr<KeyRecord[]> sorted(new KeyRecord[mCount]);
    for (unsigned shift = 0; shift < bits; shift += kDigitBits) {
        constexpr size_t kMask = (size_t{1} << kDigitBits) - 1;
        size_t places[kMask + 1] = {};
        const KeyRecord* const begin = mRecords.get();
        const KeyRecord* const end = begin + mCount;
        for (const KeyRecord* from = begin; from != end; ++from) {
            ++places[from->prefix >> shift & kMask];
        }
        size_t sum = 0;
        for (size_t& place : places) sum += std::exchange(place, sum);
        KeyRecord* const to = sorted.get();
        for (const KeyRecord* from = begin; from != end; ++from) {
            to[places[from->prefix >> shift & kMask]++] = *from;
        }
        mRecords.swap(sorted);
    }
}

void EntrySorter::sortEqualPrefixes() {
    KeyRecord* const end = mRecords.get() + mCount;
    for (KeyRecord* from = mRecords.get(); from != end;) {
        KeyRecord* to = from + 1;
        while (to != end && to->prefix == from->prefix) ++to;
        if (to - from > 1) sort(from, to);
        from = to;
    }
}

size_t EntrySorter::sortInto(ReadEntry* to) {
    if (mCount < kFewRecords) {
        sort(mRecords.get(), mRecords.get() + mCount);
    } else {
        sortByPrefix();
        sortEqualPrefixes();
    }
    const KeyRecord* const records = mRecords.get();
    const bool fetch = mCount >= kManyEntries;
    size_t kept = 0;
    for (size_t i = 0; i < mCount; ++i) {
        if (fetch)
            __builtin_prefetch(&mEntries[records[std::min(i + kFetchAhead, mCount - 1)].index]);
        const ReadEntry& entry = mEntries[records[i].index];
        if (i + 1 < mCount && records[i].prefix == records[i + 1].prefix &&
            restOf(records[i]) == restOf(records[i + 1])) {
            entry.value.destroyContainer();
        } else {
            to[kept++] = entry;
        }
    }
    return kept;
}

}  // namespace pemaro
