// SPDX-License-Identifier: Apache-2.0

// The reader of the text form (TextWriter.cpp tells what is written). It accepts more than that:
//
//   - White space (space, tab, carriage return, line feed, vertical tab, form feed) around tokens,
//     and anything before the first and behind the last bracket of the outermost container.
//   - Anything between a value of a map and the next key, a missing comma included. In an array,
//     the one character behind a nested container is skipped, whatever it is.
//   - A key without anything behind its colon, which is dropped; of equal keys, the last one counts.
//   - A double quote with a backslash before it neither opens nor closes a quoted stretch. The
//     backslash stays in the text.
//
// A map needs at least one key, so "{}" is refused, while "[]" is an empty array. A nested
// container goes from its bracket to the matching one, and is read as a text of its own. A scalar
// goes up to the next comma outside quotes or, without one, to the closing bracket of its
// container, provided that some closing bracket stands outside quotes; else it is logged as an
// error, stored as a null value, and reading goes on one character further.
//
// Every position moves forward only, which makes the whole linear but for the sorting of keys that do
// not ascend: containers are kept on a list of open levels, brackets are matched once for the whole
// text, and a token without an end, which does not move the position, is remembered so that the same
// stretch is not searched again. What was read waits as views into the text until its container is
// complete; then its size is known, its keys can be put in order, and each item is constructed where
// it stays.

#define LOG_TAG "SerializableMap"

#include "values/TreeReader.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "values/TextScan.h"
#include "values/ValueAccess.h"
#include "values/VectorStorage.h"

namespace pemaro {

namespace {

inline const char* skipSpaces(const char* at, const char* end) {
    while (at < end && isTextSpace(*at)) ++at;
    return at;
}

bool isOpenBracket(char c) {
    return kTextClasses.is(c, kOpensNested);
}

}  // namespace

inline SerializableValue TreeReader::Item::value() const {
    switch (type()) {
        case VALUE_TYPE_OBJECT:
            return ValueAccess::make(VALUE_TYPE_OBJECT, mMap, nullptr, nullptr);
        case VALUE_TYPE_ARRAY:
            return ValueAccess::make(VALUE_TYPE_ARRAY, nullptr, mArray, nullptr);
        case VALUE_TYPE_NULL:
            return ValueAccess::make(VALUE_TYPE_NULL, nullptr, nullptr, nullptr);
        default:
            return ValueAccess::make(type(), [&] { return std::string(text()); });
    }
}

void TreeReader::Item::destroyContainer() const {
    if (type() == VALUE_TYPE_OBJECT) delete mMap;
    if (type() == VALUE_TYPE_ARRAY) delete mArray;
}

TreeReader::TreeReader(const char* text)
        : mText(text),
          mTextEnd(text + strlen(text)),
          mAt(text),
          mEnd(mTextEnd),
          mLimit(mTextEnd),
          mBrackets(mTextEnd),
          mDeadUntil{nullptr, nullptr},
          mReadingKnownAt(nullptr),
          mReading(false) {}

TreeReader::~TreeReader() {
    for (const Item& item : mItems) item.destroyContainer();
}

bool TreeReader::read(SerializableMap& result) {
    if (!openOutermost(true) || !run()) return false;
    fill(result, 0);
    return true;
}

bool TreeReader::read(SerializableMapArray& result) {
    if (!openOutermost(false) || !run()) return false;
    fill(result, 0);
    return true;
}

bool TreeReader::openOutermost(bool isMap) {
    const char* const first = findChar(mText, mTextEnd, isMap ? '{' : '[');
    if (first == nullptr) {
        logReadError(isMap ? "invalid format (should start with a brace)"
                           : "invalid format (should start with a bracket)");
        return false;
    }
    const char* end = mTextEnd;
    while (end != first && *end != (isMap ? '}' : ']')) --end;
    if (end == first) {
        logReadError(isMap ? "invalid format (should end with a brace)"
                           : "invalid format (should end with a bracket)");
        return false;
    }
    open(first, end);
    mLimit = mTextEnd;
    return true;
}

/// Begins to read the container between these brackets.
void TreeReader::open(const char* first, const char* end) {
    mLevels.push({end, mItems.size()});
    mAt = first + 1;
    mEnd = end;
    mLimit = end + 1;
}

bool TreeReader::run() {
    bool opened = true;
    for (;;) {
        switch (inMap() ? readEntries(opened) : readElements()) {
            case Step::kFailed:
                logNestedFailures();
                return false;
            case Step::kOpened:
                opened = true;
                break;
            case Step::kClosed:
                if (mLevels.size() == 1) return true;
                closeNested();
                opened = false;
        }
    }
}

// Between two values of a map, mAt is where the last one ended: its comma or its closing bracket.
TreeReader::Step TreeReader::readEntries(bool atFirstKey) {
    const char* const end = mEnd;
    const char* const limit = mLimit;
    const char* at = mAt;
    for (;;) {
        if (!atFirstKey) {
            at = skipSpaces(at + 1, end);
            if (at >= end) return Step::kClosed;
        }
        atFirstKey = false;
        FoundKey found;
        if (!findKey(at, limit, found)) {
            logMissingKey();
            logReadError("invalid format: in key");
            return Step::kFailed;
        }
        const char* const start = skipSpaces(found.colon + 1, end);
        if (start >= end) return Step::kClosed;
        mItems.push(Item(found.key, VALUE_TYPE_STRING));
        if (isOpenBracket(*start)) return openNested(start);
        at = readScalar(start);
    }
}

// Between two values of an array, mAt is where the next one may begin.
TreeReader::Step TreeReader::readElements() {
    const char* const end = mEnd;
    const char* at = mAt;
    for (;;) {
        at = skipSpaces(at, end);
        if (at >= end) return Step::kClosed;
        if (isOpenBracket(*at)) return openNested(at);
        at = readScalar(at) + 1;
    }
}

TreeReader::Step TreeReader::openNested(const char* first) {
    const char* const end = mBrackets.closing(first);
    if (end == nullptr || end >= mLimit) {
        logReadError(*first == '{' ? "invalid map data" : "invalid array data");
        return Step::kFailed;
    }
    open(first, end);
    return Step::kOpened;
}

void TreeReader::closeNested() {
    const Level closed = mLevels.pop();
    if (*closed.end == '}') {
        SerializableMap* const map = new SerializableMap;
        fill(*map, closed.firstItem);
        mItems.push(Item(map));
    } else {
        SerializableMapArray* const array = new SerializableMapArray;
        fill(*array, closed.firstItem);
        mItems.push(Item(array));
    }
    mEnd = mLevels.top().end;
    mLimit = mLevels.size() == 1 ? mTextEnd : mEnd + 1;
    // Behind a nested container, an array skips the comma that should be there.
    mAt = inMap() ? closed.end : closed.end + 2;
}

/// A container that cannot be read takes all those around it along.
void TreeReader::logNestedFailures() {
    for (size_t i = mLevels.size() - 1; i > 0; --i) {
        const bool isMap = *mLevels[i].end == '}';
        if (*mLevels[i - 1].end == '}') {
            logReadError(isMap ? "invalid format: unserialize failed 1"
                               : "invalid format: unserialize failed");
        } else {
            logReadError(isMap ? "invalid format: unserialize array failed 1"
                               : "invalid format: unserialize array failed");
        }
    }
}

/// Stores the scalar that starts at `start`, which is no white space, and returns where it ended;
/// one without an end is stored as a null value, and ends where it started.
inline const char* TreeReader::readScalar(const char* start) {
    const char* const end = findTokenEnd(start);
    if (end == nullptr) {
        logReadError("pemaro: ERROR");
        mItems.push(Item({}, VALUE_TYPE_NULL));
        return start;
    }
    const char* trimmed = end;
    while (trimmed != start && isTextSpace(trimmed[-1])) --trimmed;
    std::string_view text(start, static_cast<size_t>(trimmed - start));
    const int type = text.empty() ? scalarType(text) : typeOfScalar(text);
    if (type == VALUE_TYPE_STRING) {
        text.remove_prefix(1);
        if (!text.empty()) text.remove_suffix(1);
    }
    mItems.push(Item(text, type));
    return end;
}

inline const char* TreeReader::findTokenEnd(const char* start) {
    if (mReadingKnownAt != nullptr && isDeadStart(start)) return nullptr;
    const char* const limit = mLimit;
    bool bracketFound = false;
    for (const char* at = start;; ++at) {
        at = kTextClasses.find(at, kMayEndToken);
        if (*at == ',') return at;
        if (*at == '"') {
            if (isEscaped(at)) continue;
            at = findQuote(at + 1, limit);
            if (at == nullptr) break;
        } else {
            if (at == limit) break;
            bracketFound = true;
            if (at + 1 == limit) break;
        }
    }
    return bracketFound ? mEnd : noteDeadStart(start);
}

/// Remembers that from `start` on nothing ends a token, and returns null.
const char* TreeReader::noteDeadStart(const char* start) {
    if (mReadingKnownAt == nullptr) mReadingKnownAt = start;
    mDeadUntil[readingAt(start)] = mLimit;
    return nullptr;
}

bool TreeReader::isDeadStart(const char* start) {
    return mDeadUntil[readingAt(start)] >= mLimit;
}

/// Which of the two readings a scan that begins at `at` follows. Asked for ascending places only.
bool TreeReader::readingAt(const char* at) {
    for (; mReadingKnownAt != at; ++mReadingKnownAt) {
        if (*mReadingKnownAt == '"' && !isEscaped(mReadingKnownAt)) mReading = !mReading;
    }
    return mReading;
}

void TreeReader::fill(SerializableMap& map, size_t firstItem) {
    Entry* const entries = reinterpret_cast<Entry*>(mItems.begin() + firstItem);
    size_t count = (mItems.size() - firstItem) / 2;
    for (size_t i = 1; i < count; ++i) {
        if (entries[i - 1].key.text() < entries[i].key.text()) continue;
        count = sortEntries(entries, count);
        break;
    }
    fillEntries(
            ValueAccess::entries(map), count, [&](size_t i) { return entries[i].key.text(); },
            [&](size_t i) { return entries[i].value.value(); });
    mItems.shrink(firstItem);
}

void TreeReader::fill(SerializableMapArray& array, size_t firstItem) {
    const Item* const items = mItems.begin() + firstItem;
    fillElements(ValueAccess::elements(array), mItems.size() - firstItem,
                 [&](size_t i) { return items[i].value(); });
    mItems.shrink(firstItem);
}

// ---- sorting -------------------------------------------------------------------------------------

/// The first eight bytes in which keys may differ, as a number in the same order, and which of the
/// entries has that key. Keys have no NUL, so that what is missing of eight counts as less.
struct TreeReader::KeyRecord {
    uint64_t prefix;
    size_t index;
};

/// Sorts many entries by moving small records of them: by the prefixes, digit by digit, and where
/// these are equal by the keys themselves.
class TreeReader::EntrySorter {
  public:
    EntrySorter(const Entry* entries, size_t count, const char* textEnd);

    /// Copies the entries to `to` in the order of their keys, of equal keys only the last, and
    /// returns how many these are. Destroys the containers of those that it leaves out.
    size_t sortInto(Entry* to);

  private:
    static constexpr size_t kFewRecords = 128;

    size_t commonPrefix() const;
    uint64_t prefixOf(std::string_view key) const;
    std::string_view restOf(const KeyRecord& record) const;
    bool less(const KeyRecord& a, const KeyRecord& b) const;
    void sort(KeyRecord* from, KeyRecord* to);
    void sortByPrefix();
    void sortEqualPrefixes();

    const Entry* const mEntries;
    const size_t mCount;
    const char* const mTextEnd;
    const size_t mCommon;  ///< bytes with which all keys begin
    std::vector<KeyRecord> mRecords;
};

TreeReader::EntrySorter::EntrySorter(const Entry* entries, size_t count, const char* textEnd)
        : mEntries(entries), mCount(count), mTextEnd(textEnd), mCommon(commonPrefix()) {
    mRecords.reserve(count);
    for (size_t i = 0; i < count; ++i) mRecords.push_back({prefixOf(entries[i].key.text()), i});
}

size_t TreeReader::EntrySorter::commonPrefix() const {
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

uint64_t TreeReader::EntrySorter::prefixOf(std::string_view key) const {
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

std::string_view TreeReader::EntrySorter::restOf(const KeyRecord& record) const {
    const std::string_view key = mEntries[record.index].key.text();
    return key.substr(std::min(key.size(), mCommon + sizeof(record.prefix)));
}

bool TreeReader::EntrySorter::less(const KeyRecord& a, const KeyRecord& b) const {
    if (a.prefix != b.prefix) return a.prefix < b.prefix;
    const int order = restOf(a).compare(restOf(b));
    return order != 0 ? order < 0 : a.index < b.index;
}

void TreeReader::EntrySorter::sort(KeyRecord* from, KeyRecord* to) {
    const auto inOrder = [this](const KeyRecord& a, const KeyRecord& b) { return less(a, b); };
    // What is in order already, as many times the same key, is not sorted again.
    if (!std::is_sorted(from, to, inOrder)) std::sort(from, to, inOrder);
}

/// Sorts the records by their prefixes and leaves those of equal ones in the order of the text.
void TreeReader::EntrySorter::sortByPrefix() {
    uint64_t differing = 0;
    for (const KeyRecord& record : mRecords) differing |= record.prefix ^ mRecords[0].prefix;
    std::vector<KeyRecord> sorted(mCount);
    for (size_t shift = 0; shift < 64; shift += 8) {
        if ((differing >> shift & 0xff) == 0) continue;
        size_t places[256] = {};
        for (const KeyRecord& record : mRecords) ++places[record.prefix >> shift & 0xff];
        size_t sum = 0;
        for (size_t& place : places) sum += std::exchange(place, sum);
        for (const KeyRecord& record : mRecords) {
            sorted[places[record.prefix >> shift & 0xff]++] = record;
        }
        mRecords.swap(sorted);
    }
}

void TreeReader::EntrySorter::sortEqualPrefixes() {
    KeyRecord* const end = mRecords.data() + mCount;
    for (KeyRecord* from = mRecords.data(); from != end;) {
        KeyRecord* to = from + 1;
        while (to != end && to->prefix == from->prefix) ++to;
        sort(from, to);
        from = to;
    }
}

size_t TreeReader::EntrySorter::sortInto(Entry* to) {
    if (mCount < kFewRecords) {
        sort(mRecords.data(), mRecords.data() + mCount);
    } else {
        sortByPrefix();
        sortEqualPrefixes();
    }
    size_t kept = 0;
    for (size_t i = 0; i < mCount; ++i) {
        const Entry& entry = mEntries[mRecords[i].index];
        if (i + 1 < mCount && mRecords[i].prefix == mRecords[i + 1].prefix &&
            restOf(mRecords[i]) == restOf(mRecords[i + 1])) {
            entry.value.destroyContainer();
        } else {
            to[kept++] = entry;
        }
    }
    return kept;
}

/// Puts the entries in the order of their keys, keeping the last of equal ones, and returns how many
/// are kept.
size_t TreeReader::sortEntries(Entry* entries, size_t count) {
    std::vector<Entry> sorted(count);
    const size_t kept = EntrySorter(entries, count, mTextEnd).sortInto(sorted.data());
    std::copy_n(sorted.begin(), kept, entries);
    return kept;
}

}  // namespace pemaro
