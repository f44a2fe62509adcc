// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <algorithm>
#include <cstdint>
#include <memory>

#include "values/ReadItem.h"

namespace pemaro {

/// Puts many entries in order without moving them: what is sorted are small records of them, by the
/// beginnings of the keys, digit by digit, and where these are equal by the keys themselves.
class EntrySorter {
  public:
    /// REQUIRES: at least one entry, and fewer than 2^32.
    EntrySorter(const ReadEntry* entries, size_t count, const char* textEnd);

    /// Orders the entries by their keys, of equal keys only the last, and returns how many these are.
    /// Destroys the containers of those that it leaves out.
    size_t sort();

    /// The entry at a place of the order.
    const ReadEntry& operator[](size_t place) const { return mEntries[mRecords[place].index]; }

    /// Fetches into the cache what a walk that is at `place` comes to soon.
    void fetchBehind(size_t place, size_t count) const {
        constexpr size_t kAhead = 8;
        const size_t last = count - 1;
        __builtin_prefetch(&(*this)[std::min(place + 2 * kAhead, last)]);
        const ReadEntry& entry = (*this)[std::min(place + kAhead, last)];
        __builtin_prefetch(entry.key.address());
        __builtin_prefetch(entry.value.address());
    }

  private:
    /// What of a key's beginning differs among the keys, as a number in the same order, and which of
    /// the entries has that key.
    struct KeyRecord {
        uint32_t prefix;
        uint32_t index;
    };

    static constexpr size_t kFewRecords = 64;
    static constexpr unsigned kMostDigitBits = 11;

    std::string_view restOf(const KeyRecord& record) const {
        return mEntries[record.index].key.text().substr(mCommon);
    }
    uint64_t beginningOf(const ReadEntry& entry) const;
    uint64_t compareBeginnings();
    unsigned fillRecords();
    void sortByPrefix(unsigned bits);
    void sortByKey(KeyRecord* from, KeyRecord* to) const;
    size_t sortEqualPrefixes();

    const ReadEntry* const mEntries;
    const size_t mCount;
    const char* const mTextEnd;
    std::unique_ptr<KeyRecord[]> mRecords;
    size_t mCommon = 0;  ///< bytes with which all keys begin
};

}  // namespace pemaro
