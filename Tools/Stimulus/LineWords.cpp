#include "Tools/Stimulus/LineWords.h"

#include <algorithm>
#include <charconv>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::string_view kBlanks = " \t\r";
constexpr std::string_view kTimeUnit = "ms";
constexpr std::size_t kLongestQuote = 40; // characters

bool isBlank(char c) { return kBlanks.find(c) != std::string_view::npos; }

bool isInRange(std::optional<std::int64_t> value, std::int64_t lowest, std::int64_t highest) {
    return value && *value >= lowest && *value <= highest;
}

} // namespace

std::string_view withoutTrailingBlanks(std::string_view text) noexcept {
    return text.substr(0, text.find_last_not_of(kBlanks) + 1);
}

std::string_view withoutOuterBlanks(std::string_view text) noexcept {
    text = withoutTrailingBlanks(text);
    text.remove_prefix(std::min(text.find_first_not_of(kBlanks), text.size()));
    return text;
}

std::string_view withoutComment(std::string_view line) noexcept {
    bool isQuoted = false;
    for (std::size_t i = 0; i < line.size(); ++i) {
        if (line[i] == '\\' && isQuoted)
            ++i; // whatever follows is escaped
        else if (line[i] == '"')
            isQuoted = !isQuoted;
        else if (line[i] == '#' && !isQuoted && (i == 0 || isBlank(line[i - 1])))
            return line.substr(0, i);
    }
    return line;
}

LineWords::LineWords(std::string_view line) : _rest(withoutOuterBlanks(line)) {}

std::string_view LineWords::peek() const noexcept { return _rest.substr(0, _rest.find_first_of(kBlanks)); }

std::string_view LineWords::take() {
    const std::string_view word = peek();
    _rest = withoutOuterBlanks(_rest.substr(word.size()));
    return word;
}

std::string_view LineWords::require(std::string_view what) {
    if (empty())
        throw LineProblem(std::string(what) + " is missing");
    return take();
}

void LineWords::requireEnd() const {
    if (!empty())
        throw LineProblem("unexpected " + quoted(peek()));
}

std::string quoted(std::string_view word) {
    std::string text("'");
    text.append(word.substr(0, kLongestQuote)).append(word.size() > kLongestQuote ? "...'" : "'");
    return text;
}

std::optional<std::int64_t> integerFrom(std::string_view word) noexcept {
    std::int64_t value = 0;
    const char *const end = word.data() + word.size();
    const auto [stop, error] = std::from_chars(word.data(), end, value);
    if (error != std::errc() || stop != end)
        return std::nullopt;
    return value;
}

std::int64_t integerInRange(std::string_view word, std::string_view what, std::int64_t lowest,
                            std::int64_t highest) {
    const auto value = integerFrom(word);
    if (isInRange(value, lowest, highest))
        return *value;
    std::string message = quoted(word);
    message.append(" is no ").append(what).append(" from ");
    message.append(std::to_string(lowest)).append(" to ").append(std::to_string(highest));
    throw LineProblem(message);
}

std::int64_t timeInRange(std::string_view word, std::int64_t lowestMs, std::int64_t highestMs) {
    if (word.ends_with(kTimeUnit)) {
        const auto value = integerFrom(word.substr(0, word.size() - kTimeUnit.size()));
        if (isInRange(value, lowestMs, highestMs))
            return *value;
    }
    throw LineProblem(quoted(word) + " is no time from " + std::to_string(lowestMs) + "ms to " +
                      std::to_string(highestMs) + "ms");
}

} // namespace ZorvaTouch::Tools
