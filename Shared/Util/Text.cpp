#include "Shared/Util/Text.h"

#include <array>
#include <charconv>
#include <cmath>

namespace ZorvaTouch::Util {
namespace {

template <typename T> std::string_view decimalText(std::array<char, 24> &buffer, T value) {
    const auto result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value);
    return {buffer.data(), static_cast<std::size_t>(result.ptr - buffer.data())};
}

constexpr bool isBetween(unsigned char byte, unsigned char low, unsigned char high) {
    return byte >= low && byte <= high;
}

struct Utf8Lead {
    std::size_t length; ///< bytes in the whole sequence; 0 for a byte that cannot lead one
    unsigned char secondLow,
        secondHigh; ///< range of the second byte, where overlong forms and surrogates are ruled out
};

constexpr Utf8Lead classifyLead(unsigned char lead) {
    if (lead < 0x80)
        return {1, 0, 0};
    if (isBetween(lead, 0xC2, 0xDF))
        return {2, 0x80, 0xBF};
    if (isBetween(lead, 0xE0, 0xEF))
        return {3, static_cast<unsigned char>(lead == 0xE0 ? 0xA0 : 0x80),
                static_cast<unsigned char>(lead == 0xED ? 0x9F : 0xBF)};
    if (isBetween(lead, 0xF0, 0xF4))
        return {4, static_cast<unsigned char>(lead == 0xF0 ? 0x90 : 0x80),
                static_cast<unsigned char>(lead == 0xF4 ? 0x8F : 0xBF)};
    return {0, 0, 0};
}

struct Utf8Sequence {
    std::size_t length; ///< bytes to consume: the whole sequence, or the longest part of one that began well
    bool valid;
};

Utf8Sequence nextSequence(std::string_view text) {
    const auto byteAt = [text](std::size_t i) { return static_cast<unsigned char>(text[i]); };
    const Utf8Lead lead = classifyLead(byteAt(0));
    if (lead.length == 0)
        return {1, false};
    for (std::size_t i = 1; i < lead.length; ++i) {
        const bool fits = i < text.size() && (i == 1 ? isBetween(byteAt(1), lead.secondLow, lead.secondHigh)
                                                     : isBetween(byteAt(i), 0x80, 0xBF));
        if (!fits)
            return {i, false};
    }
    return {lead.length, true};
}

constexpr std::string_view kHexDigits = "0123456789abcdef";

void appendHexByte(std::string &text, unsigned char byte) {
    text.push_back(kHexDigits[byte / 16U]);
    text.push_back(kHexDigits[byte % 16U]);
}

constexpr bool isControl(unsigned char byte) { return byte < 0x20 || byte == 0x7F; }

void appendControl(std::string &text, unsigned char byte) {
    switch (byte) {
    case '\n':
        text.append("\\n");
        return;
    case '\r':
        text.append("\\r");
        return;
    case '\t':
        text.append("\\t");
        return;
    default:
        appendHexByte(text.append("\\x"), byte);
    }
}

} // namespace

void appendInteger(std::string &text, std::int64_t value, std::size_t width) {
    std::array<char, 24> buffer;
    const std::string_view digits = decimalText(buffer, value);
    if (digits.size() < width)
        text.append(width - digits.size(), ' ');
    text.append(digits);
}

void appendUnsigned(std::string &text, std::uint64_t value) {
    std::array<char, 24> buffer;
    text.append(decimalText(buffer, value));
}

void appendFixed(std::string &text, double value) {
    if (std::isnan(value)) {
        text.append("nan"); // never "-nan": the sign of a NaN differs between processors and compilers
        return;
    }
    std::array<char, 320> buffer; // the largest double has 309 digits before the point
    const auto result =
        std::to_chars(buffer.data(), buffer.data() + buffer.size(), value, std::chars_format::fixed, 6);
    text.append(buffer.data(), result.ptr);
}

void appendShortest(std::string &text, double value) {
    const double magnitude = std::fabs(value);
    const bool plain = magnitude == 0.0 || (magnitude >= 1e-4 && magnitude < 1e16);
    std::array<char, 32> buffer;
    const auto result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value,
                                      plain ? std::chars_format::fixed : std::chars_format::scientific);
    const std::string_view digits(buffer.data(), static_cast<std::size_t>(result.ptr - buffer.data()));
    text.append(digits);
    if (plain && digits.find('.') == std::string_view::npos)
        text.append(".0");
}

std::string repairUtf8(std::string_view text) {
    std::string repaired;
    repaired.reserve(text.size());
    while (!text.empty()) {
        const Utf8Sequence sequence = nextSequence(text);
        repaired.append(sequence.valid ? text.substr(0, sequence.length) : "\xEF\xBF\xBD");
        text.remove_prefix(sequence.length);
    }
    return repaired;
}

std::string printable(std::string_view text) {
    std::string result;
    result.reserve(text.size());
    while (!text.empty()) {
        const Utf8Sequence sequence = nextSequence(text);
        const auto lead = static_cast<unsigned char>(text.front());
        if (!sequence.valid)
            result.append("\xEF\xBF\xBD");
        else if (isControl(lead))
            appendControl(result, lead);
        else if (lead == 0xC2 && static_cast<unsigned char>(text[1]) < 0xA0)
            appendHexByte(result.append("\\u00"), static_cast<unsigned char>(text[1]));
        else
            result.append(text.substr(0, sequence.length));
        text.remove_prefix(sequence.length);
    }
    return result;
}

std::string_view withoutLineBreaksAtTheEnd(std::string_view text) noexcept {
    return text.substr(0, text.find_last_not_of("\r\n") + 1); // npos + 1 is 0
}

bool isValidUtf8(std::string_view text) noexcept {
    while (!text.empty()) {
        const Utf8Sequence sequence = nextSequence(text);
        if (!sequence.valid)
            return false;
        text.remove_prefix(sequence.length);
    }
    return true;
}

} // namespace ZorvaTouch::Util
