// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "values/BracketIndex.h"
#include "values/ReadItem.h"
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

    void fill(SerializableMap& map, size_t firstItem);
    template <typename Entries, typename Announce>
    void fillFrom(SerializableMap& map, const Entries& entries, size_t count, Announce announce);
    void fill(SerializableMapArray& array, size_t firstItem);

    const char* const mText;
    const char* const mTextEnd;
    const char* mAt;
    // Of the innermost level: its closing bracket, and where its text ends. To the reader of a nested
    // container the text ends behind its bracket; behind the outermost one there may be more.
    const char* mEnd;
    const char* mLimit;
    WorkStack<Level, 16> mLevels;
    WorkStack<ReadItem, 48> mItems;
    BracketIndex mBrackets;

    // Of the two readings of the text (see BracketIndex), up to where each is known to have nothing
    // that ends a token. Only kept once a token without an end was met, from its start on.
    const char* mDeadUntil[2];
    const char* mReadingKnownAt;
    bool mReading;
};

}  // namespace pemaro
