#pragma once

#include <cstdint>
#include <string>
#include <string_view>

/// How text looks on a screen.
namespace ZorvaTouch::Tools {

enum class Colour { None, Bold, Dim, Green, Yellow, Magenta, Cyan };

/// Appends text in a colour, or plainly when colours are off.
void appendColoured(std::string &text, std::string_view content, Colour colour, bool usesColour);

/// Appends text and blanks up to a width. Counts characters, not bytes; what is longer stays whole.
void appendLeft(std::string &text, std::string_view content, std::size_t width);
/// Appends blanks up to a width and text.
void appendRight(std::string &text, std::string_view content, std::size_t width);

/// Columns that help and summaries may take.
inline constexpr std::size_t kTextColumns = 80;
/// Appends a line of words that begins at a column, wrapped at `kTextColumns`; further lines begin at the
/// same column. One that fits stays as it is; a word that does not fit stays whole.
/// @param separator  What may stand at the end of a line: " ", or ", " in a list whose items stay whole.
void appendWrapped(std::string &text, std::string_view line, std::size_t column,
                   std::string_view separator = " ");

/// Characters in UTF-8 text.
[[nodiscard]] std::size_t widthOf(std::string_view text) noexcept;

/// A number in units of `perUnit`, with three decimals that are cut and not rounded: 1,234,567 ns are "1.234"
/// ms.
/// @param perUnit  1,000,000,000 shows nanoseconds as seconds, 1,000,000 as milliseconds.
[[nodiscard]] std::string fixedPointText(std::int64_t value, std::int64_t perUnit);

/// A number with this many decimals, rounded.
[[nodiscard]] std::string decimalText(double value, int decimals);

} // namespace ZorvaTouch::Tools
