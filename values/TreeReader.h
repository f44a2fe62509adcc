// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "values/BracketIndex.h"
#include "values/WorkStack.h"

namespace pemaro {

/// Reads one text into a map or an array, once.
class TreeReader {
  public:
    /// `text` outlives the reader.
    explicit TreeReader(const char* text);
    ~TreeReader();
    TreeReader(const TreeReader&) = delete;
    TreeReader& operator=(const TreeReader&) = delete;

    /// Read the text into `result`. False after logging why not; `result` is as it was then.
    bool read(SerializableMap& result);
    bool read(SerializableMapArray& result);

  private:
    /// What was read and waits for its container to be complete: a key, a scalar's text with its
    /// tag, or a map or array. Texts are views into what is read.
    class Item {
      public:
        Item() = default;
        Item(std::string_view text, int type)
                : mText(text.data()),
                  mLengthAndType(text.size() << 8 | static_cast<size_t>(type)) {}
        explicit Item(SerializableMap* map) : mMap(map), mLengthAndType(VALUE_TYPE_OBJECT) {}
        explicit Item(SerializableMapArray* array)
                : mArray(array), mLengthAndType(VALUE_TYPE_ARRAY) {}

        std::string_view text() const { return {mText, mLengthAndType >> 8}; }
        unsigned type() const { return mLengthAndType & 0xff; }
        SerializableValue value() const;
        void destroyContainer() const;

      private:
        union {
            const char* mText;
            SerializableMap* mMap;
            SerializableMapArray* mArray;
        };
        size_t mLengthAndType;
    };
    struct Entry {
        Item key;
        Item value;
    };
    struct KeyRecord;
    class EntrySorter;

    /// A map or an array that is being read.
    struct Level {
        const char* end;   ///< its closing bracket
        size_t firstItem;  ///< its items are those from this one on; a map's are keys and values
    };

    enum class Step { kFailed, kOpened, kClosed };

    bool openOutermost(bool isMap);
    void open(const char* first, const char* end);
    bool inMap() const { return *mEnd == '}'; }
    bool run();
    Step readEntries(bool atFirstKey);
    Step readElements();
    Step openNested(const char* open);
    void closeNested();
    void logNestedFailures();

    const char* readScalar(const char* start);
    const char* findTokenEnd(const char* start);
    const char* noteDeadStart(const char* start);
    bool isDeadStart(const char* start);
    bool readingAt(const char* at);

    size_t sortEntries(Entry* entries, size_t count);
    void fill(SerializableMap& map, size_t firstItem);
    void fill(SerializableMapArray& array, size_t firstItem);

    const char* const mText;
    const char* const mTextEnd;
    const char* mAt;
    // Of the innermost level: its closing bracket, and where its text ends. To the reader of a nested
    // container the text ends behind its bracket; behind the outermost one there may be more.
    const char* mEnd;
    const char* mLimit;
    WorkStack<Level, 16> mLevels;
    WorkStack<Item, 48> mItems;
    BracketIndex mBrackets;

    // Of the two readings of the text (see BracketIndex), up to where each is known to have nothing
    // that ends a token. Only kept once a token without an end was met, from its start on.
    const char* mDeadUntil[2];
    const char* mReadingKnownAt;
    bool mReading;
};

}  // namespace pemaro
