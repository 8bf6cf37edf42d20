#include "Shared/Util/Hex.h"

#include <array>
#include <charconv>
#include <optional>
#include <stdexcept>

namespace ZorvaTouch::Util {
namespace {

constexpr std::uint8_t kNoDigit = 0xFF;

constexpr std::array<std::uint8_t, 256> makeDigitValues() {
    std::array<std::uint8_t, 256> values{};
    values.fill(kNoDigit);
    for (unsigned i = 0; i < 10; ++i)
        values['0' + i] = static_cast<std::uint8_t>(i);
    for (unsigned i = 0; i < 6; ++i)
        values['a' + i] = values['A' + i] = static_cast<std::uint8_t>(10 + i);
    return values;
}

constexpr std::array<std::uint8_t, 256> kDigitValues = makeDigitValues();

constexpr std::uint8_t digitValue(char c) { return kDigitValues[static_cast<std::uint8_t>(c)]; }

constexpr bool isSpace(char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }

std::string_view takeToken(std::string_view &text) {
    std::size_t begin = 0;
    while (begin < text.size() && isSpace(text[begin]))
        ++begin;
    std::size_t end = begin;
    while (end < text.size() && !isSpace(text[end]))
        ++end;
    const std::string_view token = text.substr(begin, end - begin);
    text.remove_prefix(end);
    return token;
}

/// A whole token as a 16-bit number; empty for anything else.
std::optional<std::uint16_t> parseToken(std::string_view token) {
    if (token.starts_with("0x") || token.starts_with("0X"))
        token.remove_prefix(2);
    std::uint16_t value = 0;
    const char *end = token.data() + token.size();
    const auto [stop, error] =
        std::from_chars(token.data(), end, value, 16); // takes no sign for unsigned types
    if (error != std::errc() || stop != end)
        return std::nullopt;
    return value;
}

/// Reads the canonical form, two digits and a space per byte, which is what every recorded report looks like.
/// Stops at the first place that has another form and leaves it to the general reader.
void readCanonicalBytes(std::string_view &text, std::vector<std::uint8_t> &bytes) {
    std::size_t at = 0;
    for (; text.size() - at >= kHexCharactersPerByte; at += kHexCharactersPerByte) {
        const std::uint8_t high = digitValue(text[at]);
        const std::uint8_t low = digitValue(text[at + 1]);
        if (((high | low) & 0xF0) != 0 || text[at + 2] != ' ')
            break;
        bytes.push_back(static_cast<std::uint8_t>(high << 4 | low));
    }
    text.remove_prefix(at);
}

} // namespace

void appendHexString(std::string &text, std::span<const std::uint8_t> bytes) {
    constexpr std::string_view kDigits = "0123456789abcdef";
    std::size_t at = text.size();
    text.resize(at + bytes.size() * kHexCharactersPerByte);
    for (const std::uint8_t byte : bytes) {
        text[at++] = kDigits[byte >> 4];
        text[at++] = kDigits[byte & 0xF];
        text[at++] = ' ';
    }
}

std::string hexStringFromBytes(std::span<const std::uint8_t> bytes) {
    std::string text;
    appendHexString(text, bytes);
    return text;
}

void bytesFromHexString(std::string_view text, std::vector<std::uint8_t> &bytes) {
    bytes.clear();
    bytes.reserve(text.size() / kHexCharactersPerByte);
    readCanonicalBytes(text, bytes);
    for (std::string_view token = takeToken(text); !token.empty(); token = takeToken(text)) {
        const std::optional<std::uint16_t> value = parseToken(token);
        if (!value)
            return;
        if (*value >= 256)
            throw std::invalid_argument("invalid hex string");
        bytes.push_back(static_cast<std::uint8_t>(*value));
    }
}

std::vector<std::uint8_t> bytesFromHexString(std::string_view text) {
    std::vector<std::uint8_t> bytes;
    bytesFromHexString(text, bytes);
    return bytes;
}

} // namespace ZorvaTouch::Util
