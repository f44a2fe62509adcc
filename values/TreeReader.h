// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string_view>
#include <vector>

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "values/BracketIndex.h"

namespace pemaro {

/// Reads one text into a map or an array, once.
class TreeReader {
  public:
    /// `text` outlives the reader.
    explicit TreeReader(const char* text);
    ~TreeReader();
    TreeReader(const TreeReader&) = delete;
    TreeReader& operator=(const TreeReader&) = delete;

    /// Read the text into `result`, which is empty. False after logging why not; `result` is still
    /// empty then.
    bool read(SerializableMap& result);
    bool read(SerializableMapArray& result);

  private:
    /// A value that was read and waits for its container to be complete: a text with its tag, or
    /// the map or array that it holds. The views point into the text that is read.
    struct Item {
        std::string_view key;
        std::string_view text;
        int type;
        SerializableMap* map;
        SerializableMapArray* array;
    };

    /// A map or an array that is being read. A nested one ends at the bracket that matches its
    /// first, and to its reader the text ends there too; behind the outermost one there may be
    /// more.
    struct Level {
        bool isMap;
        const char* end;       ///< its closing bracket
        const char* limit;     ///< where its text ends
        size_t firstItem;      ///< its items are those from this one on
        bool atFirstKey;       ///< of a map: no key was looked for yet
        std::string_view key;  ///< of a map: the key whose value is being read
    };

    enum class Step { kFailed, kOpened, kClosed };

    bool openOutermost(bool isMap);
    bool run();
    Step readEntries();
    Step readElements();
    Step findNextKey(const char*& valueStart);
    Step openNested(const char* open);
    void closeNested();
    void logNestedFailures();

    const char* readScalar(const char* start);
    const char* findTokenEnd(const char* start);
    bool isDeadStart(const char* start);
    bool readingAt(const char* at);

    void keepLastOfEqualKeys(size_t firstItem);
    void fill(SerializableMap& map, size_t firstItem);
    void fill(SerializableMapArray& array, size_t firstItem);
    template <typename Container>
    void moveItems(Container& container, size_t firstItem);

    const char* const mText;
    const char* const mTextEnd;
    const char* mAt;
    std::vector<Level> mLevels;
    std::vector<Item> mItems;
    std::optional<BracketIndex> mBrackets;

    // Of the two readings of the text (see BracketIndex), up to where each is known to have nothing
    // that ends a token. Only kept once a token without an end was met, from its start on.
    const char* mDeadUntil[2];
    const char* mReadingKnownAt;
    bool mReading;
};

}  // namespace pemaro
