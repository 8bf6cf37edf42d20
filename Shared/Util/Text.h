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

/// Returns text from outside (a name, a user's word, a log record) as one line that does nothing to a
/// terminal: line feed, carriage return and tab become `\n`, `\r`, `\t`; other control characters below
/// U+0020 and U+007F become `\x1b`; those from U+0080 to U+009F become `\u009b`; malformed UTF-8 becomes
/// U+FFFD. All else, backslashes too, stays as it is.
[[nodiscard]] std::string printable(std::string_view text);

/// Returns `text` without the line feeds and carriage returns at its end.
[[nodiscard]] std::string_view withoutLineBreaksAtTheEnd(std::string_view text) noexcept;

/// Whether `text` is well-formed UTF-8: no overlong forms, no surrogates, nothing above U+10FFFF.
[[nodiscard]] bool isValidUtf8(std::string_view text) noexcept;

} // namespace ZorvaTouch::Util
