// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <memory>

#include "values/ReadItem.h"

namespace pemaro {

/// Sorts many entries by moving small records of them: by the prefixes, digit by digit, and where
/// these are equal by the keys themselves.
class EntrySorter {
  public:
    EntrySorter(const ReadEntry* entries, size_t count, const char* textEnd);

    /// Copies the entries to `to` in the order of their keys, of equal keys only the last, and
    /// returns how many these are. Destroys the containers of those that it leaves out.
    size_t sortInto(ReadEntry* to);

  private:
    /// The eight bytes of a key behind those that all keys begin with, as a number in the same
    /// order, and which of the entries has that key. Keys have no NUL, so that what is missing of
    /// eight counts as less.
    struct KeyRecord {
        uint64_t prefix;
        size_t index;
    };

    static constexpr size_t kFewRecords = 128;
    static constexpr unsigned kDigitBits = 10;

    std::string_view keyOf(const KeyRecord& record) const {
        return mEntries[record.index].key.text();
    }
    size_t commonPrefix() const;
    uint64_t prefixOf(std::string_view key) const;
    std::string_view restOf(const KeyRecord& record) const;
    bool less(const KeyRecord& a, const KeyRecord& b) const;
    void sort(KeyRecord* from, KeyRecord* to) const;
    unsigned packPrefixes();
    void sortByPrefix();
    void sortEqualPrefixes();

    const ReadEntry* const mEntries;
    const size_t mCount;
    const char* const mTextEnd;
    const size_t mCommon;  ///< bytes with which all keys begin
    std::unique_ptr<KeyRecord[]> mRecords;
    uint64_t mDiffering = 0;  ///< bits in which the prefixes differ
};

}  // namespace pemaro
