// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <vector>

namespace pemaro {

/// Which bracket closes which, for a whole text at once.
///
/// The closing bracket of a "{" is found by counting "{" up and "}" down behind it, that of a "["
/// by counting those, disregarding whatever stands in quoted stretches, where a stretch begins and
/// ends at a double quote without a backslash before it. What counts as quoted thus depends on
/// where the counting begins, but only on the parity of the quotes before that place: there are two
/// readings of a text, each with braces and with square brackets to match, which is four stacks and
/// one pass.
class BracketIndex {
  public:
    /// Matches the brackets in [from, limit).
    BracketIndex(const char* from, const char* limit);

    /// The bracket that closes the one at `open`, or null when there is none. Asked for ascending
    /// places only.
    const char* closing(const char* open);

  private:
    struct Pair {
        const char* open;
        const char* close;
        size_t outer;  ///< of the brackets of its stack, the one open around it
    };

    void push(size_t& top, const char* open);
    void pop(size_t& top, const char* close);

    std::vector<Pair> mPairs;
    size_t mNext = 0;
};

}  // namespace pemaro
