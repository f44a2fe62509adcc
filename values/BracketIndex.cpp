// SPDX-License-Identifier: Apache-2.0
#include "values/BracketIndex.h"

#include "values/TextScan.h"

namespace pemaro {

namespace {
constexpr size_t kNone = static_cast<size_t>(-1);
}

const char* BracketIndex::closing(const char* open) {
    for (Reading& reading : mReadings) {
        if (!reading.matched) reading.match(open, mLimit);
        const Pair* const pair = reading.find(open);
        if (pair != nullptr) return pair->close;
    }
    return nullptr;  // not reached: outside the quotes of one reading is inside those of the other
}

void BracketIndex::Reading::match(const char* from, const char* limit) {
    matched = true;
    size_t brace = kNone;
    size_t square = kNone;
    const auto push = [this](size_t& top, const char* open) {
        Pair pair;
        pair.open = open;
        pair.outer = top;
        top = pairs.size();
        pairs.push(pair);
    };
    const auto pop = [this](size_t& top, const char* close) {
        if (top == kNone) return;
        Pair& pair = pairs[top];
        top = pair.outer;
        pair.close = close;
    };
    for (const char* at = from; at != limit; ++at) {
        at = kTextClasses.find(at, kMayMatch);
        if (*at == '"') {
            if (isEscaped(at)) continue;
            at = findQuote(at + 1, limit);
            if (at == nullptr) break;
        } else if (*at == '{') {
            push(brace, at);
        } else if (*at == '[') {
            push(square, at);
        } else if (*at == '}') {
            pop(brace, at);
        } else if (*at == ']') {
            pop(square, at);
        } else {
            break;
        }
    }
    while (brace != kNone) pop(brace, nullptr);
    while (square != kNone) pop(square, nullptr);
}

const BracketIndex::Pair* BracketIndex::Reading::find(const char* open) {
    while (next < pairs.size() && pairs[next].open < open) ++next;
    return next < pairs.size() && pairs[next].open == open ? &pairs[next] : nullptr;
}

}  // namespace pemaro
