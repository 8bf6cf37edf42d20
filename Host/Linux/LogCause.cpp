#include "Host/Linux/LogCause.h"

#include <algorithm>
#include <cstddef>

namespace ZorvaTouch::Linux {
namespace {

constexpr std::size_t kLongestText = 256;
constexpr std::string_view kDigits = "0123456789";
constexpr std::string_view kHexDigits = "0123456789abcdefABCDEF";

bool isDigit(char c) noexcept { return c >= '0' && c <= '9'; }

/// The length of the number that a text begins with.
std::size_t numberLength(std::string_view text) noexcept {
    const bool isHex = text.starts_with("0x") || text.starts_with("0X");
    const std::size_t hexEnd = isHex ? std::min(text.find_first_not_of(kHexDigits, 2), text.size()) : 0;
    return hexEnd > 2 ? hexEnd : std::min(text.find_first_not_of(kDigits), text.size());
}

} // namespace

std::string logCause(Ports::LogLevel level, std::string_view origin, std::string_view text) {
    std::string cause(1, static_cast<char>('0' + static_cast<int>(level)));
    cause.append(origin);
    for (std::size_t length = 0; !text.empty() && length < kLongestText; ++length) {
        const bool isNumber = isDigit(text.front());
        cause += isNumber ? '#' : text.front();
        text.remove_prefix(isNumber ? numberLength(text) : 1);
    }
    return cause;
}

} // namespace ZorvaTouch::Linux
