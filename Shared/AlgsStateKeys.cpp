#include "Shared/Algs.h"

#include "Shared/Util/StateKey.h"

#include <array>
#include <cstdint>
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

struct Tunable {
    std::string_view key;
    PropertyValue (*read)(const HandStats &hand);
    void (*write)(HandStats &hand, const PropertyValue &value);
};

constexpr std::array<Tunable, 4> kTunables{{
    {"EnableHoldSuppression", [](const HandStats &hand) { return PropertyValue(hand.enableHoldSuppression); },
     [](HandStats &hand, const PropertyValue &value) { hand.enableHoldSuppression = value.toBool(); }},
    {"EnableTapSuppression", [](const HandStats &hand) { return PropertyValue(hand.enableTapSuppression); },
     [](HandStats &hand, const PropertyValue &value) { hand.enableTapSuppression = value.toBool(); }},
    {"ActivationThreshold", [](const HandStats &hand) { return PropertyValue(hand.activationThreshold); },
     [](HandStats &hand, const PropertyValue &value) { hand.activationThreshold = value.toFloat(); }},
    // The low 32 bits of what was written: 2^32 + 500 sets 500.
    {"HoldTimeoutMilliseconds", [](const HandStats &hand) { return PropertyValue(hand.holdTimeoutMs); },
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

bool Algs::isWritableKey(std::string_view key) {
    return findTunable(key) || key == kResetEventStatsKey ||
           parseFactorIndex(key).value_or(kVirtualPixelCount) < kVirtualPixelCount;
}

} // namespace ZorvaTouch
