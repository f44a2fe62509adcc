// SPDX-License-Identifier: Apache-2.0
#include "values/BracketIndex.h"

#include "values/TextScan.h"

namespace pemaro {

namespace {
constexpr size_t kNone = static_cast<size_t>(-1);
}

BracketIndex::BracketIndex(const char* from, const char* limit) {
    size_t braces[2] = {kNone, kNone};
    size_t squares[2] = {kNone, kNone};
    unsigned reading = 0;
    for (const char* at = from; at != limit; ++at) {
        switch (*at) {
            case '"':
                reading ^= isEscaped(at) ? 0 : 1;
                break;
            case '{':
                push(braces[reading], at);
                break;
            case '[':
                push(squares[reading], at);
                break;
            case '}':
                pop(braces[reading], at);
                break;
            case ']':
                pop(squares[reading], at);
                break;
            default:
                break;
        }
    }
}

void BracketIndex::push(size_t& top, const char* open) {
    mPairs.push_back({open, nullptr, top});
    top = mPairs.size() - 1;
}

void BracketIndex::pop(size_t& top, const char* close) {
    if (top == kNone) return;
    Pair& pair = mPairs[top];
    pair.close = close;
    top = pair.outer;
}

const char* BracketIndex::closing(const char* open) {
    while (mPairs[mNext].open != open) ++mNext;
    return mPairs[mNext].close;
}

}  // namespace pemaro
