#include "Shared/Algs.h"

#include "Shared/StateKeys.h"
#include "Shared/Util/StateKey.h"
#include "Shared/Util/Text.h"

#include <array>
#include <cmath>
#include <cstdint>
#include <limits>
#include <locale>
#include <optional>
#include <sstream>

// The recognizer's state keys: what can be read and written, by name.

namespace ZorvaTouch {
namespace {

constexpr std::string_view kFactorDomain = "VirtualNormalizationFactors";
constexpr std::string_view kEventStatsKey = "EventStats";
constexpr std::string_view kDebugInfoKey = "DebugInfo";
constexpr std::string_view kResetEventStatsKey = "ResetEventStats";

using Range = StateRange;

constexpr Range kSwitch{Range::Kind::Boolean};
/// Scaled counts: the largest signal, 32767, times the largest of the electrodes' factors is less.
constexpr Range kThreshold{Range::Kind::Number, 0, 100'000};
constexpr Range kMilliseconds{Range::Kind::WholeNumber, 0, std::numeric_limits<std::uint32_t>::max()};
constexpr Range kFactor{Range::Kind::Number, 0, 1'000};
constexpr Range kAnything{Range::Kind::Anything};

struct Tunable {
    std::string_view key;
    Range range; ///< for tools: `write` converts any value
    PropertyValue (*read)(const HandStats &hand);
    void (*write)(HandStats &hand, const PropertyValue &value);
};

constexpr std::array<Tunable, 4> kTunables{{
    {"EnableHoldSuppression", kSwitch,
     [](const HandStats &hand) { return PropertyValue(hand.enableHoldSuppression); },
     [](HandStats &hand, const PropertyValue &value) { hand.enableHoldSuppression = value.toBool(); }},
    {"EnableTapSuppression", kSwitch,
     [](const HandStats &hand) { return PropertyValue(hand.enableTapSuppression); },
     [](HandStats &hand, const PropertyValue &value) { hand.enableTapSuppression = value.toBool(); }},
    {"ActivationThreshold", kThreshold,
     [](const HandStats &hand) { return PropertyValue(hand.activationThreshold); },
     [](HandStats &hand, const PropertyValue &value) { hand.activationThreshold = value.toFloat(); }},
    // The low 32 bits of what was written: 2^32 + 500 sets 500.
    {"HoldTimeoutMilliseconds", kMilliseconds,
     [](const HandStats &hand) { return PropertyValue(hand.holdTimeoutMs); },
     [](HandStats &hand, const PropertyValue &value) {
         hand.holdTimeoutMs = static_cast<std::uint32_t>(value.toUnsigned());
     }},
}};

const Tunable *findTunable(std::string_view key) {
    for (const Tunable &tunable : kTunables)
        if (tunable.key == key)
            return &tunable;
    return nullptr;
}

/// Index in a factor key, or nothing if the key is none.
///
/// Read as a stream reads an unsigned number: leading blanks and a sign are taken, "-1" wraps, text after the
/// digits is ignored, text without digits is 0, and an overflow gives 2^64-1, which no list is long enough
/// for.
std::optional<std::uint64_t> parseFactorIndex(std::string_view key) {
    std::string rest(key);
    if (!Util::stripDomainFromKey(rest, kFactorDomain))
        return std::nullopt;
    std::istringstream stream(rest);
    stream.imbue(std::locale::classic());
    std::uint64_t index = 0;
    stream >> index;
    return index;
}

std::optional<double> numberIn(const PropertyValue &value) {
    if (const std::uint64_t *const number = value.asUnsigned())
        return static_cast<double>(*number);
    const double *const number = value.asDouble();
    return number ? std::optional(*number) : std::nullopt;
}

} // namespace

PropertyValue Algs::getState(std::string_view key) const {
    if (const Tunable *tunable = findTunable(key))
        return tunable->read(_handStats);
    if (const auto index = parseFactorIndex(key))
        return *index < kVirtualPixelCount ? PropertyValue(_virtualImage.normalizationFactors[*index])
                                           : PropertyValue();
    if (key == kEventStatsKey)
        return _eventStats.statsDictionary();
    if (key == kDebugInfoKey)
        return PropertyValue::Dictionary{{std::string(kEventStatsKey), _eventStats.statsDictionary()}};
    return {};
}

void Algs::setState(std::string_view key, const PropertyValue &value) {
    if (const Tunable *tunable = findTunable(key))
        tunable->write(_handStats, value);
    else if (key == kResetEventStatsKey)
        _eventStats.Reset();
    else if (const auto index = parseFactorIndex(key); index && *index < kVirtualPixelCount)
        setFactor(*index, value.toFloat());
}

void Algs::setFactor(std::size_t index, float factor) noexcept {
    _virtualImage.normalizationFactors[index] = factor;
    _virtualPixels[index].gain = factor; // works from the next frame on
}

bool Algs::isWritableKey(std::string_view key) { return stateRange(key).has_value(); }

// --- For tools

bool StateRange::contains(const PropertyValue &value) const {
    const double number = numberIn(value).value_or(std::numeric_limits<double>::quiet_NaN());
    const bool isWithin = number >= lowest && number <= highest; // NaN never is
    switch (kind) {
    case Kind::Boolean:
        return value.asBool() || number == 0 || number == 1;
    case Kind::Number:
        return isWithin;
    case Kind::WholeNumber:
        return isWithin && number == std::trunc(number);
    case Kind::Anything:
        break;
    }
    return true;
}

std::string StateRange::text() const {
    if (kind == Kind::Boolean)
        return "true or false";
    if (kind == Kind::Anything)
        return "any value";
    std::string text(kind == Kind::WholeNumber ? "an integer from " : "a number from ");
    Util::appendUnsigned(text, static_cast<std::uint64_t>(lowest));
    Util::appendUnsigned(text.append(" to "), static_cast<std::uint64_t>(highest));
    return text;
}

std::optional<StateRange> stateRange(std::string_view key) {
    if (const Tunable *tunable = findTunable(key))
        return tunable->range;
    if (key == kResetEventStatsKey)
        return kAnything;
    if (parseFactorIndex(key).value_or(kVirtualPixelCount) < kVirtualPixelCount)
        return kFactor;
    return std::nullopt;
}

std::span<const std::string_view> writableStateKeys() {
    static constexpr auto kKeys = [] {
        std::array<std::string_view, kTunables.size() + 2> keys{};
        for (std::size_t i = 0; i < kTunables.size(); ++i)
            keys[i] = kTunables[i].key;
        keys[kTunables.size()] = "VirtualNormalizationFactors.0 to .22";
        keys[kTunables.size() + 1] = kResetEventStatsKey;
        return keys;
    }();
    return kKeys;
}

} // namespace ZorvaTouch
