#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

/// Small pieces of text formatting that no locale can change.
namespace ZorvaTouch::Util {

/// Appends an integer in decimal, padded with spaces on the left to at least `width` characters ("%*d").
void appendInteger(std::string &text, std::int64_t value, std::size_t width = 0);

/// Appends an unsigned integer in decimal ("%ju").
void appendUnsigned(std::string &text, std::uint64_t value);

/// Appends a number with six decimals ("%f"). Any NaN, whatever its sign, is "nan"; infinities are "inf",
/// "-inf".
void appendFixed(std::string &text, double value);

/// Appends the shortest decimal text that reads back to the same double and is a floating-point number to
/// every reader: whole numbers keep ".0", very large and very small ones use an exponent ("200.0", "0.1",
/// "1e+22"). `value` must be finite.
void appendShortest(std::string &text, double value);

/// Returns `text` with every malformed UTF-8 sequence replaced by U+FFFD.
[[nodiscard]] std::string repairUtf8(std::string_view text);

/// Whether `text` is well-formed UTF-8: no overlong forms, no surrogates, nothing above U+10FFFF.
[[nodiscard]] bool isValidUtf8(std::string_view text) noexcept;

} // namespace ZorvaTouch::Util
