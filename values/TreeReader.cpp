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
#include <memory>

#include "values/EntrySorter.h"
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

/// Whether the keys, which have at least one character each, are in order and not equal.
inline bool ascends(const ReadItem& a, const ReadItem& b) {
    const auto first = static_cast<unsigned char>(a.text().front());
    const auto second = static_cast<unsigned char>(b.text().front());
    return first != second ? first < second : a.text() < b.text();
}

}  // namespace

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
    for (const ReadItem& item : mItems) item.destroyContainer();
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
        mItems.push(ReadItem(found.key, VALUE_TYPE_STRING));
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
        mItems.push(ReadItem(map));
    } else {
        SerializableMapArray* const array = new SerializableMapArray;
        fill(*array, closed.firstItem);
        mItems.push(ReadItem(array));
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
        mItems.push(ReadItem({}, VALUE_TYPE_NULL));
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
    mItems.push(ReadItem(text, type));
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
    const ReadEntry* entries = reinterpret_cast<const ReadEntry*>(mItems.begin() + firstItem);
    size_t count = (mItems.size() - firstItem) / 2;
    size_t ascending = 1;
    while (ascending < count && ascends(entries[ascending - 1].key, entries[ascending].key)) {
        ++ascending;
    }
    if (ascending >= count) {
        fillFrom(map, entries, count, [](size_t) {});
    } else {
        EntrySorter sorted(entries, count, mTextEnd);
        count = sorted.sort();
        // Where they do not stay in the cache, each is taken from another place of the memory.
        const bool fetch = count >= kManyEntries;
        fillFrom(map, sorted, count, [&](size_t i) {
            if (fetch) sorted.fetchBehind(i, count);
        });
    }
    mItems.shrink(firstItem);
}

/// Fills a map with entries[0] and so on; before each, `announce` is told its place.
template <typename Entries, typename Announce>
void TreeReader::fillFrom(SerializableMap& map, const Entries& entries, size_t count,
                          Announce announce) {
    fillEntries(
            ValueAccess::entries(map), count,
            [&](size_t i) {
                announce(i);
                return entries[i].key.text();
            },
            [&](size_t i) { return entries[i].value.value(); });
}

void TreeReader::fill(SerializableMapArray& array, size_t firstItem) {
    const ReadItem* const items = mItems.begin() + firstItem;
    fillElements(ValueAccess::elements(array), mItems.size() - firstItem,
                 [&](size_t i) { return items[i].value(); });
    mItems.shrink(firstItem);
}

}  // namespace pemaro
