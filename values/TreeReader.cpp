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
// Every position moves forward only, which makes the whole linear: containers are kept on a list of
// open levels, brackets are matched once for the whole text, and a token without an end, which does
// not move the position, is remembered so that the same stretch is not searched again. What was
// read waits as views into the text until its container is complete; then its size is known, its
// keys can be put in order, and the vectors of the platform are filled without ever moving a value.

#define LOG_TAG "SerializableMap"

#include "values/TreeReader.h"

#include <algorithm>
#include <cstring>

#include "values/TextScan.h"
#include "values/ValueAccess.h"
#include "values/ValueTree.h"

namespace pemaro {

namespace {

const char* skipSpaces(const char* at, const char* end) {
    while (at < end && isTextSpace(*at)) ++at;
    return at;
}

bool isOpenBracket(char c) {
    return c == '{' || c == '[';
}

}  // namespace

TreeReader::TreeReader(const char* text)
        : mText(text),
          mTextEnd(text + strlen(text)),
          mAt(text),
          mDeadUntil{nullptr, nullptr},
          mReadingKnownAt(nullptr),
          mReading(false) {}

TreeReader::~TreeReader() {
    for (const Item& item : mItems) {
        delete item.map;
        delete item.array;
    }
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
    const char* const open = strchr(mText, isMap ? '{' : '[');
    if (open == nullptr) {
        logReadError(isMap ? "invalid format (should start with a brace)"
                           : "invalid format (should start with a bracket)");
        return false;
    }
    const char* const end = strrchr(open, isMap ? '}' : ']');
    if (end == nullptr) {
        logReadError(isMap ? "invalid format (should end with a brace)"
                           : "invalid format (should end with a bracket)");
        return false;
    }
    mLevels.push_back({isMap, end, mTextEnd, 0, true, {}});
    mAt = open + 1;
    return true;
}

bool TreeReader::run() {
    for (;;) {
        switch (mLevels.back().isMap ? readEntries() : readElements()) {
            case Step::kFailed:
                logNestedFailures();
                return false;
            case Step::kOpened:
                break;
            case Step::kClosed:
                if (mLevels.size() == 1) return true;
                closeNested();
        }
    }
}

// Between two values of a map, mAt is where the last one ended: its comma or its closing bracket.
TreeReader::Step TreeReader::readEntries() {
    for (;;) {
        const char* start = nullptr;
        const Step step = findNextKey(start);
        if (step != Step::kOpened) return step;
        if (isOpenBracket(*start)) return openNested(start);
        mAt = readScalar(start);
    }
}

/// kOpened when a key and a value, at `valueStart`, come next.
TreeReader::Step TreeReader::findNextKey(const char*& valueStart) {
    Level& level = mLevels.back();
    if (!level.atFirstKey) {
        mAt = skipSpaces(mAt + 1, level.end);
        if (mAt >= level.end) return Step::kClosed;
    }
    level.atFirstKey = false;
    FoundKey found;
    if (!scanKey(mAt, level.limit, found)) {
        logReadError("invalid format: in key");
        return Step::kFailed;
    }
    level.key = found.key;
    valueStart = skipSpaces(found.colon + 1, level.end);
    return valueStart < level.end ? Step::kOpened : Step::kClosed;
}

// Between two values of an array, mAt is where the next one may begin.
TreeReader::Step TreeReader::readElements() {
    const char* const end = mLevels.back().end;
    for (;;) {
        mAt = skipSpaces(mAt, end);
        if (mAt >= end) return Step::kClosed;
        if (isOpenBracket(*mAt)) return openNested(mAt);
        mAt = readScalar(mAt) + 1;
    }
}

TreeReader::Step TreeReader::openNested(const char* open) {
    const bool isMap = *open == '{';
    if (!mBrackets) mBrackets.emplace(open, mTextEnd);
    const char* const end = mBrackets->closing(open);
    if (end == nullptr || end >= mLevels.back().limit) {
        logReadError(isMap ? "invalid map data" : "invalid array data");
        return Step::kFailed;
    }
    mLevels.push_back({isMap, end, end + 1, mItems.size(), true, {}});
    mAt = open + 1;
    return Step::kOpened;
}

void TreeReader::closeNested() {
    const Level closed = mLevels.back();
    mLevels.pop_back();
    Item item{mLevels.back().key, {}, VALUE_TYPE_OBJECT, nullptr, nullptr};
    if (closed.isMap) {
        item.map = new SerializableMap;
        fill(*item.map, closed.firstItem);
    } else {
        item.type = VALUE_TYPE_ARRAY;
        item.array = new SerializableMapArray;
        fill(*item.array, closed.firstItem);
    }
    mItems.push_back(item);
    // Behind a nested container, an array skips the comma that should be there.
    mAt = mLevels.back().isMap ? closed.end : closed.end + 2;
}

/// A container that cannot be read takes all those around it along.
void TreeReader::logNestedFailures() {
    for (size_t i = mLevels.size() - 1; i > 0; --i) {
        const bool isMap = mLevels[i].isMap;
        if (mLevels[i - 1].isMap) {
            logReadError(isMap ? "invalid format: unserialize failed 1"
                               : "invalid format: unserialize failed");
        } else {
            logReadError(isMap ? "invalid format: unserialize array failed 1"
                               : "invalid format: unserialize array failed");
        }
    }
}

/// Stores the scalar that starts at `start` and returns where it ended; one without an end is
/// stored as a null value, and ends where it started.
const char* TreeReader::readScalar(const char* start) {
    Item item{mLevels.back().key, {}, VALUE_TYPE_NULL, nullptr, nullptr};
    const char* const end = findTokenEnd(start);
    if (end == nullptr) {
        logReadError("pemaro: ERROR");
        mItems.push_back(item);
        return start;
    }
    item.text = trimSpaces(std::string_view(start, static_cast<size_t>(end - start)));
    item.type = scalarType(item.text);
    if (item.type == VALUE_TYPE_STRING) {
        item.text.remove_prefix(1);
        if (!item.text.empty()) item.text.remove_suffix(1);
    }
    mItems.push_back(item);
    return end;
}

const char* TreeReader::findTokenEnd(const char* start) {
    if (isDeadStart(start)) return nullptr;
    const Level& level = mLevels.back();
    bool quoted = false;
    bool bracketFound = false;
    for (const char* at = start; at != level.limit; ++at) {
        switch (*at) {
            case '"':
                quoted ^= !isEscaped(at);
                break;
            case ',':
                if (!quoted) return at;
                break;
            case ']':
            case '}':
                bracketFound |= !quoted;
                break;
            default:
                break;
        }
    }
    if (bracketFound) return level.end;
    if (mReadingKnownAt == nullptr) mReadingKnownAt = start;
    mDeadUntil[readingAt(start)] = level.limit;
    return nullptr;
}

bool TreeReader::isDeadStart(const char* start) {
    return mReadingKnownAt != nullptr && mDeadUntil[readingAt(start)] >= mLevels.back().limit;
}

/// Which of the two readings a scan that begins at `at` follows. Asked for ascending places only.
bool TreeReader::readingAt(const char* at) {
    for (; mReadingKnownAt != at; ++mReadingKnownAt) {
        if (*mReadingKnownAt == '"' && !isEscaped(mReadingKnownAt)) mReading = !mReading;
    }
    return mReading;
}

/// Sorts the items of a map by key.
void TreeReader::keepLastOfEqualKeys(size_t firstItem) {
    const auto begin = mItems.begin() + static_cast<ptrdiff_t>(firstItem);
    const auto outOfOrder = [](const Item& a, const Item& b) { return a.key >= b.key; };
    if (std::adjacent_find(begin, mItems.end(), outOfOrder) == mItems.end()) return;

    std::stable_sort(begin, mItems.end(),
                     [](const Item& a, const Item& b) { return a.key < b.key; });
    auto kept = begin;
    for (auto item = begin; item != mItems.end(); ++item) {
        const auto next = item + 1;
        if (next != mItems.end() && next->key == item->key) {
            delete item->map;
            delete item->array;
        } else {
            *kept++ = *item;
        }
    }
    mItems.erase(kept, mItems.end());
}

void TreeReader::fill(SerializableMap& map, size_t firstItem) {
    keepLastOfEqualKeys(firstItem);
    const Item* const items = mItems.data() + firstItem;
    appendEmpty(map, mItems.size() - firstItem,
                [items](size_t i) { return std::string(items[i].key); });
    moveItems(map, firstItem);
}

void TreeReader::fill(SerializableMapArray& array, size_t firstItem) {
    appendEmpty(array, mItems.size() - firstItem);
    moveItems(array, firstItem);
}

/// Gives the null values of a container the contents of the items.
template <typename Container>
void TreeReader::moveItems(Container& container, size_t firstItem) {
    for (size_t i = firstItem; i < mItems.size(); ++i) {
        const Item& item = mItems[i];
        SerializableValue& value = ValueAccess::edit(container, i - firstItem);
        ValueAccess::type(value) = static_cast<uint32_t>(item.type);
        ValueAccess::map(value) = item.map;
        ValueAccess::array(value) = item.array;
        ValueAccess::text(value).assign(item.text.data(), item.text.size());
    }
    mItems.resize(firstItem);
}

}  // namespace pemaro
