// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>

#include "values/WorkStack.h"

namespace pemaro {

/// Which bracket closes which, for a whole text at once.
///
/// The closing bracket of a "{" is found by counting "{" up and "}" down behind it, that of a "["
/// by counting those, disregarding whatever stands in quoted stretches, where a stretch begins and
/// ends at a double quote without a backslash before it. What counts as quoted thus depends on
/// where the counting begins, but only on the parity of the quotes before that place: there are two
/// readings of a text. Each is matched in one pass, from the first bracket on that is asked for and
/// stands outside the quotes of that reading; a text that a writer made needs but one of them.
class BracketIndex {
  public:
    /// Knows the brackets before `limit`, where the text ends with a NUL.
    explicit BracketIndex(const char* limit) : mLimit(limit) {}

    /// The bracket that closes the one at `open`, or null when there is none. Asked for ascending
    /// places only.
    const char* closing(const char* open);

  private:
    struct Pair {
        const char* open;
        union {
            const char* close;
            size_t outer;  ///< while it is open: the one of its kind around it
        };
    };

    struct Reading {
        bool matched = false;
        size_t next = 0;
        WorkStack<Pair, 16> pairs;

        void match(const char* from, const char* limit);
        const Pair* find(const char* open);
    };

    const char* const mLimit;
    Reading mReadings[2];
};

}  // namespace pemaro
