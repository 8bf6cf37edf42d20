#pragma once

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// What is wrong with a line, without saying which line it is.
class LineProblem : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// One line of the text form, word by word. Words stand apart by blanks and tabs.
class LineWords {
public:
    explicit LineWords(std::string_view line);

    [[nodiscard]] bool empty() const noexcept { return _rest.empty(); }
    /// What is left of the line, without blanks around it.
    [[nodiscard]] std::string_view rest() const noexcept { return _rest; }
    /// The next word, without taking it; empty at the end.
    [[nodiscard]] std::string_view peek() const noexcept;
    /// Takes the next word; empty at the end.
    std::string_view take();

    /// Takes the next word.
    /// @param what  What it is, for the message.
    /// @throws LineProblem  "a time is missing" at the end of the line.
    std::string_view require(std::string_view what);

    /// @throws LineProblem  if something is left.
    void requireEnd() const;

private:
    std::string_view _rest;
};

/// Without blanks and tabs at both ends; carriage returns count as blanks.
[[nodiscard]] std::string_view withoutOuterBlanks(std::string_view text) noexcept;
[[nodiscard]] std::string_view withoutTrailingBlanks(std::string_view text) noexcept;

/// Removes a comment: from a "#" at the start or after a blank, unless it is inside double quotes.
[[nodiscard]] std::string_view withoutComment(std::string_view line) noexcept;

/// A word for a message: in quotes, and shortened if it is long.
[[nodiscard]] std::string quoted(std::string_view word);

/// A whole word as a decimal integer with an optional minus; nothing if it is none or too large for 64 bits.
[[nodiscard]] std::optional<std::int64_t> integerFrom(std::string_view word) noexcept;

/// A decimal integer in a range.
/// @param what  What it is, for the message.
/// @throws LineProblem  "'x' is no frame number from 0 to 4294967295"
[[nodiscard]] std::int64_t integerInRange(std::string_view word, std::string_view what, std::int64_t lowest,
                                          std::int64_t highest);

/// A time written with its unit, "120ms".
/// @return Milliseconds.
/// @throws LineProblem  "'120' is no time from 1ms to 1000000ms"
[[nodiscard]] std::int64_t timeInRange(std::string_view word, std::int64_t lowestMs, std::int64_t highestMs);

} // namespace ZorvaTouch::Tools
