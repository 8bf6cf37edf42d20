#include "Tests/Support/SensorSequence.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>

namespace ZorvaTouch::Scripted {
namespace {

template <typename Table> const auto &oneOf(const Table &table, Dice &dice) {
    return table[static_cast<std::size_t>(dice.between(0, static_cast<int>(table.size()) - 1))];
}

std::int16_t saturated(int counts) { return static_cast<std::int16_t>(std::clamp(counts, -32768, 32767)); }

/// Roughly what the channels scale their electrodes' signals by.
constexpr std::array<double, kElectrodeCount> kGains{1.92, 1.88, 1.93, 1.88, 1.92, 1.81, 1.01, 1.0,
                                                     1.49, 1.50, 2.42, 1.54, 1.54, 1.04, 1.05};

constexpr std::array<std::int16_t, 10> kRangeEnds{-32768, -32767, -1, 0, 1, 39, 75, 76, 32766, 32767};

/// A sensor clock just before it wraps, and other times to jump to.
constexpr std::array<std::uint32_t, 5> kOddTimes{0, 1, 2147483647u, 4294967000u, 4294967295u};

} // namespace

std::uint32_t Dice::bits() noexcept {
    _state = _state * 6364136223846793005u + 1442695040888963407u;
    return static_cast<std::uint32_t>(_state >> 32);
}

int Dice::between(int lowest, int highest) noexcept {
    const auto span = static_cast<std::uint32_t>(highest - lowest) + 1;
    return lowest + static_cast<int>(bits() % span);
}

InputReport::Image SensorSequence::next() {
    if (_framesLeft == 0)
        beginEpisode();
    InputReport::Image image{};
    image.frameNumber = _number++;
    image.timeMs = _timeMs;
    for (int i = 0; i < static_cast<int>(kElectrodeCount); ++i)
        image.signals[static_cast<std::size_t>(i)] = signalOf(i);
    _timeMs += static_cast<std::uint32_t>(_intervalMs);
    _centre += _drift;
    ++_frame;
    --_framesLeft;
    return image;
}

void SensorSequence::beginEpisode() {
    // Fingers and the pauses between them come most often.
    const int kind = _dice.between(0, 9);
    _episode = kind <= 3   ? Episode::Noise
               : kind <= 6 ? Episode::Finger
                           : static_cast<Episode>(_dice.between(2, static_cast<int>(Episode::Count) - 1));
    _frame = 0;
    _framesLeft = _dice.onceIn(3) ? _dice.between(20, 90) : _dice.between(1, 12);
    _noise = _dice.onceIn(4) ? _dice.between(20, 90) : _dice.between(0, 8);
    _strength = _dice.between(60, 900);
    _neighbour = _dice.between(30, 80);
    _centre = _dice.between(0, 140) / 10.0;
    _drift = _dice.onceIn(2) ? 0.0 : _dice.between(-40, 40) / 100.0;
    _width = _dice.between(5, 40) / 10.0;
    if (_dice.onceIn(10))
        _intervalMs = _dice.onceIn(4) ? _dice.between(0, 1) : _dice.between(2, 30);
    if (_dice.onceIn(60))
        _timeMs = _dice.onceIn(3) ? _dice.bits() : oneOf(kOddTimes, _dice);
}

std::int16_t SensorSequence::signalOf(int electrode) {
    const int noise = _dice.between(-_noise, _noise);
    switch (_episode) {
    case Episode::Finger:
        return saturated(fingerSignal(electrode) + noise);
    case Episode::BesideK:
        return saturated(besideKSignal(electrode));
    case Episode::Palm:
        return saturated(_strength * _dice.between(60, 100) / 100 + noise);
    case Episode::EqualChannels: {
        const bool isMember = (electrode + _neighbour) % 3 != 0;
        return saturated(
            isMember ? static_cast<int>(_strength / kGains[static_cast<std::size_t>(electrode)]) + 1 : 0);
    }
    case Episode::WildBits:
        return saturated(static_cast<int>(_dice.bits() >> 16) - 32768);
    case Episode::RangeEnds:
        return oneOf(kRangeEnds, _dice);
    case Episode::Noise:
    case Episode::Count:
        break;
    }
    return saturated(noise);
}

int SensorSequence::fingerSignal(int electrode) const {
    const double distance = std::abs(electrode - _centre) / _width;
    const bool isEdge = _frame == 0 || _framesLeft == 1;
    const double strength = isEdge ? _strength * 0.6 : _strength;
    return static_cast<int>(strength * std::max(0.0, 1.0 - distance * 0.5));
}

int SensorSequence::besideKSignal(int electrode) const {
    // K (10) strongest; then I (8) with J, or M (12) with L.
    constexpr int kK = 10;
    const int towards = _centre < 7 ? -1 : 1;
    const double scaled = electrode == kK                 ? _strength
                          : electrode == kK + 2 * towards ? _strength * _neighbour / 100.0
                          : electrode == kK + towards     ? _strength * _neighbour / 300.0
                                                          : 0.0;
    return static_cast<int>(scaled / kGains[static_cast<std::size_t>(electrode)]);
}

StateWrite oddStateWrite(Dice &dice) {
    static const double kNaN = std::numeric_limits<double>::quiet_NaN();
    static const double kInfinity = std::numeric_limits<double>::infinity();
    static const std::vector<StateWrite> usual{
        {"ActivationThreshold", 200.0},          {"ActivationThreshold", 200u},
        {"HoldTimeoutMilliseconds", 500u},       {"HoldTimeoutMilliseconds", 60.0},
        {"EnableHoldSuppression", true},         {"EnableTapSuppression", true},
        {"VirtualNormalizationFactors.18", 0.4}, {"VirtualNormalizationFactors.19", 0.4},
    };
    static const std::vector<PropertyValue> oddValues{0u,
                                                      1u,
                                                      0.0,
                                                      -0.0,
                                                      1.0,
                                                      76.5,
                                                      -200.0,
                                                      1e-40,
                                                      1e30,
                                                      -1e300,
                                                      kNaN,
                                                      -kNaN,
                                                      kInfinity,
                                                      -kInfinity,
                                                      true,
                                                      false,
                                                      "soon",
                                                      "",
                                                      PropertyValue(),
                                                      4294967296u + 60u,
                                                      18446744073709551615u,
                                                      33u,
                                                      100.0,
                                                      PropertyValue::Array{1u}};
    static const std::vector<std::string> keys{"ActivationThreshold",
                                               "ActivationThreshold",
                                               "HoldTimeoutMilliseconds",
                                               "EnableHoldSuppression",
                                               "EnableTapSuppression",
                                               "EnableHoldSuppression",
                                               "EnableTapSuppression",
                                               "ResetEventStats",
                                               "EventStats",
                                               "Unknown",
                                               "activationThreshold",
                                               "VirtualNormalizationFactors",
                                               "VirtualNormalizationFactors.",
                                               "VirtualNormalizationFactors.x",
                                               "VirtualNormalizationFactors.-1",
                                               "VirtualNormalizationFactors.+7",
                                               "VirtualNormalizationFactors. 8",
                                               "VirtualNormalizationFactors.99999999999999999999",
                                               "VirtualNormalizationFactors.12e"};
    if (dice.onceIn(2))
        return oneOf(usual, dice);
    std::string key = oneOf(keys, dice);
    if (dice.onceIn(3))
        key = "VirtualNormalizationFactors." + std::to_string(dice.between(0, 24));
    return {key, oneOf(oddValues, dice)};
}

} // namespace ZorvaTouch::Scripted
