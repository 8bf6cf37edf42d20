#include "Host/Linux/IioText.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <system_error>

namespace ZorvaTouch::Linux {
namespace {

constexpr unsigned kMostRepeats = 16;

/// What is left to read of a text.
class Rest {
public:
    explicit Rest(std::string_view text) noexcept : _text(text) {}

    [[nodiscard]] bool isEmpty() const noexcept { return _text.empty(); }
    [[nodiscard]] bool take(std::string_view expected) noexcept {
        if (!_text.starts_with(expected))
            return false;
        _text.remove_prefix(expected.size());
        return true;
    }
    [[nodiscard]] bool take(unsigned &number) noexcept {
        const auto [next, error] = std::from_chars(_text.data(), _text.data() + _text.size(), number);
        if (error != std::errc())
            return false;
        _text.remove_prefix(static_cast<std::size_t>(next - _text.data()));
        return true;
    }
    /// A number where this stands before it.
    [[nodiscard]] bool takeOptional(std::string_view before, unsigned &number) noexcept {
        return !take(before) || take(number);
    }

private:
    std::string_view _text;
};

/// One of two words. @return Whether it was one of them.
bool takeEither(Rest &rest, std::string_view no, std::string_view yes, bool &isYes) noexcept {
    isYes = rest.take(yes);
    return isYes || rest.take(no);
}

bool isPowerOfTwo(unsigned number) noexcept { return number != 0 && (number & (number - 1)) == 0; }

bool isPossible(const ScanType &type) noexcept {
    const bool isStored = type.storageBits >= 8 && type.storageBits <= 64 && isPowerOfTwo(type.storageBits);
    const bool isRepeated = isPowerOfTwo(type.repeat) && type.repeat <= kMostRepeats;
    return isStored && isRepeated && type.bits > 0 && type.bits <= type.storageBits &&
           type.shift <= type.storageBits - type.bits;
}

std::string_view takeWord(std::string_view &text) noexcept {
    const std::size_t begin = std::min(text.find_first_not_of(' '), text.size());
    const std::size_t end = std::min(text.find(' ', begin), text.size());
    const std::string_view word = text.substr(begin, end - begin);
    text.remove_prefix(end);
    return word;
}

/// Whether a frequency serves the wish better than another.
bool isBetter(double frequency, double other, double wanted) noexcept {
    if ((frequency >= wanted) != (other >= wanted))
        return frequency >= wanted;
    return frequency >= wanted ? frequency < other : frequency > other;
}

} // namespace

std::optional<ScanType> parseScanType(std::string_view text) noexcept {
    Rest rest(text);
    ScanType type;
    const bool isRead = takeEither(rest, "le", "be", type.isBigEndian) && rest.take(":") &&
                        takeEither(rest, "u", "s", type.isSigned) && rest.take(type.bits) && rest.take("/") &&
                        rest.take(type.storageBits) && rest.takeOptional("X", type.repeat) &&
                        rest.takeOptional(">>", type.shift) && rest.isEmpty();
    if (!isRead || !isPossible(type))
        return std::nullopt;
    return type;
}

std::optional<unsigned> parseIioCount(std::string_view text) noexcept {
    Rest rest(text);
    unsigned number = 0;
    if (!rest.take(number) || !rest.isEmpty())
        return std::nullopt;
    return number;
}

std::optional<double> parseIioNumber(std::string_view text) noexcept {
    double number = 0;
    const char *const end = text.data() + text.size();
    const auto [next, error] = std::from_chars(text.data(), end, number);
    if (error != std::errc() || next != end || !std::isfinite(number))
        return std::nullopt;
    return number;
}

std::optional<std::string> closestFrequency(std::string_view available, double wanted) {
    std::optional<double> best;
    std::string_view bestWord;
    while (!available.empty()) {
        const std::string_view word = takeWord(available);
        const std::optional<double> frequency = parseIioNumber(word);
        if (!frequency || *frequency <= 0 || (best && !isBetter(*frequency, *best, wanted)))
            continue;
        best = frequency;
        bestWord = word;
    }
    return best ? std::optional(std::string(bestWord)) : std::nullopt;
}

} // namespace ZorvaTouch::Linux
