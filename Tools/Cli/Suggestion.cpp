#include "Tools/Cli/Suggestion.h"

#include <algorithm>
#include <cstddef>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::size_t kLongestWord = 64; ///< a longer word is not a misspelling; bounds the work

char lowered(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

bool isSame(char a, char b) { return lowered(a) == lowered(b); }

/// Edits that turn one word into the other.
std::size_t distance(std::string_view a, std::string_view b) {
    std::vector<std::size_t> before;
    std::vector<std::size_t> above(b.size() + 1);
    std::vector<std::size_t> row(b.size() + 1);
    for (std::size_t j = 0; j <= b.size(); ++j)
        row[j] = j;
    for (std::size_t i = 1; i <= a.size(); ++i) {
        before = above;
        above = row;
        row[0] = i;
        for (std::size_t j = 1; j <= b.size(); ++j) {
            const bool same = isSame(a[i - 1], b[j - 1]);
            row[j] = std::min({above[j] + 1, row[j - 1] + 1, above[j - 1] + (same ? 0 : 1)});
            if (i > 1 && j > 1 && isSame(a[i - 1], b[j - 2]) && isSame(a[i - 2], b[j - 1]))
                row[j] = std::min(row[j], before[j - 2] + 1);
        }
    }
    return row[b.size()];
}

/// Edits that still count as a misspelling.
std::size_t mostEdits(std::string_view word) { return std::max<std::size_t>(1, word.size() / 4); }

} // namespace

std::string_view closestName(std::string_view word, std::span<const std::string_view> names) {
    std::string_view closest;
    if (word.empty() || word.size() > kLongestWord)
        return closest;
    std::size_t fewest = mostEdits(word) + 1;
    for (const std::string_view name : names)
        if (const std::size_t edits = distance(word, name); edits < fewest) {
            closest = name;
            fewest = edits;
        }
    return closest;
}

std::string suggestion(std::string_view word, std::span<const std::string_view> names,
                       std::string_view otherwise) {
    const std::string_view closest = closestName(word, names);
    return closest.empty() ? std::string(otherwise) : "; did you mean '" + std::string(closest) + "'?";
}

} // namespace ZorvaTouch::Tools
