#include "Tools/Cli/Layout.h"

#include "Shared/Util/Text.h"

#include <algorithm>
#include <array>
#include <charconv>

namespace ZorvaTouch::Tools {
namespace {

/// Control sequences of terminals, in the order of `Colour`.
constexpr std::array<std::string_view, 7> kColourSequences{"",         "\x1b[1m",  "\x1b[2m", "\x1b[32m",
                                                           "\x1b[33m", "\x1b[35m", "\x1b[36m"};
constexpr std::string_view kPlainSequence = "\x1b[0m";

std::size_t blanksFor(std::string_view content, std::size_t width) {
    return width - std::min(width, widthOf(content));
}

} // namespace

void appendColoured(std::string &text, std::string_view content, Colour colour, bool usesColour) {
    if (!usesColour || colour == Colour::None) {
        text.append(content);
        return;
    }
    text.append(kColourSequences[static_cast<std::size_t>(colour)]).append(content).append(kPlainSequence);
}

void appendLeft(std::string &text, std::string_view content, std::size_t width) {
    text.append(content).append(blanksFor(content, width), ' ');
}

void appendRight(std::string &text, std::string_view content, std::size_t width) {
    text.append(blanksFor(content, width), ' ').append(content);
}

void appendWrapped(std::string &text, std::string_view line, std::size_t column, std::string_view separator) {
    const std::size_t width = kTextColumns - column;
    const std::size_t shown = separator.size() - 1; // of the separator, at the end of a line
    while (widthOf(line) > width) {
        std::size_t end = line.rfind(separator, width - shown);
        if (end == std::string_view::npos || line.find_first_not_of(' ') > end)
            end = line.find(separator, width);
        if (end == std::string_view::npos)
            break;
        text.append(line.substr(0, end + shown)).append("\n").append(column, ' ');
        line.remove_prefix(end + separator.size());
    }
    text.append(line);
}

std::size_t widthOf(std::string_view text) noexcept {
    const auto continues = [](char c) { return (static_cast<unsigned char>(c) & 0xC0u) == 0x80u; };
    return text.size() - static_cast<std::size_t>(std::count_if(text.begin(), text.end(), continues));
}

std::string fixedPointText(std::int64_t value, std::int64_t perUnit) {
    const bool isNegative = value < 0;
    // Unsigned, so that the smallest number has a magnitude too.
    const auto magnitude =
        isNegative ? 0 - static_cast<std::uint64_t>(value) : static_cast<std::uint64_t>(value);
    const std::uint64_t thousandths = magnitude / static_cast<std::uint64_t>(perUnit / 1000);
    const std::uint64_t decimals = thousandths % 1000;
    std::string text(isNegative ? "-" : "");
    Util::appendUnsigned(text, thousandths / 1000);
    text.append(decimals < 10 ? ".00" : decimals < 100 ? ".0" : ".");
    Util::appendUnsigned(text, decimals);
    return text;
}

std::string decimalText(double value, int decimals) {
    std::array<char, 400> buffer; // the largest double has 309 digits before the point
    const auto result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value,
                                      std::chars_format::fixed, decimals);
    return {buffer.data(), result.ptr};
}

} // namespace ZorvaTouch::Tools
