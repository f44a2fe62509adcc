// SPDX-License-Identifier: Apache-2.0
#include "tools/common/NearestWord.h"

#include <algorithm>

namespace pemaro::tools {
namespace {

/// How many letters have to be added, left out, replaced or exchanged with their neighbour to make
/// one word of the other.
size_t distance(const std::string& a, const std::string& b) {
    std::vector<std::vector<size_t>> steps(a.size() + 1, std::vector<size_t>(b.size() + 1));
    for (size_t i = 0; i <= a.size(); ++i) {
        for (size_t j = 0; j <= b.size(); ++j) {
            if (i == 0 || j == 0) {
                steps[i][j] = i + j;
                continue;
            }
            const size_t replaced = steps[i - 1][j - 1] + (a[i - 1] == b[j - 1] ? 0 : 1);
            steps[i][j] = std::min({replaced, steps[i - 1][j] + 1, steps[i][j - 1] + 1});
            if (i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1]) {
                steps[i][j] = std::min(steps[i][j], steps[i - 2][j - 2] + 1);
            }
        }
    }
    return steps[a.size()][b.size()];
}

}  // namespace

std::string nearestWord(const std::string& typed, const std::vector<std::string>& words) {
    std::string nearest;
    // One letter in three may be wrong, and more are no longer the same word.
    size_t least = std::max<size_t>(typed.size() / 3, 1) + 1;
    for (const std::string& word : words) {
        const size_t steps = distance(typed, word);
        if (steps < least) {
            least = steps;
            nearest = word;
        }
    }
    return nearest;
}

std::string nearestWordHint(const std::string& typed, const std::vector<std::string>& words) {
    const std::string nearest = nearestWord(typed, words);
    return nearest.empty() ? "" : "; did you mean '" + nearest + "'?";
}

}  // namespace pemaro::tools
