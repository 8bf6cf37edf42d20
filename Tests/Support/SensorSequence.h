#pragma once

#include "Shared/InputReport.h"
#include "Shared/Util/PropertyValue.h"

#include <cstdint>
#include <string>
#include <vector>

namespace ZorvaTouch::Scripted {

/// Numbers that are the same on every machine: the standard distributions differ between libraries.
class Dice {
public:
    explicit Dice(std::uint64_t seed) noexcept : _state(seed * 2 + 1) {}

    [[nodiscard]] std::uint32_t bits() noexcept;
    /// Evenly from `lowest` to `highest`.
    [[nodiscard]] int between(int lowest, int highest) noexcept;
    /// True once in `times`.
    [[nodiscard]] bool onceIn(int times) noexcept { return between(1, times) == 1; }

private:
    std::uint64_t _state;
};

/// What a sensor may go through: noise, fingers that rest, wander and leave, palms, equal values, wild bits
/// and the ends of the range, one episode after the other, without end.
class SensorSequence {
public:
    explicit SensorSequence(std::uint64_t seed) noexcept : _dice(seed) {}

    /// The next image. The numbers ascend; times mostly do, in steps of 0 to some 30 ms, but the clock also
    /// jumps and wraps.
    [[nodiscard]] InputReport::Image next();

    /// The dice, for what a test does between images.
    [[nodiscard]] Dice &dice() noexcept { return _dice; }

private:
    enum class Episode { Noise, Finger, BesideK, Palm, EqualChannels, WildBits, RangeEnds, Count };

    void beginEpisode();
    [[nodiscard]] std::int16_t signalOf(int electrode);
    [[nodiscard]] int fingerSignal(int electrode) const;
    [[nodiscard]] int besideKSignal(int electrode) const;

    Dice _dice;
    Episode _episode = Episode::Noise;
    int _framesLeft = 0;
    int _frame = 0; ///< of the episode
    int _intervalMs = 10;
    int _noise = 0;     ///< counts, either way
    int _strength = 0;  ///< of a finger or a palm, of equal channels when scaled; counts
    int _neighbour = 0; ///< percent of it that K's neighbours have
    double _centre = 0; ///< electrode under the finger
    double _drift = 0;  ///< electrodes a frame
    double _width = 1;  ///< electrodes to either side
    std::uint32_t _number = 0;
    std::uint32_t _timeMs = 0;
};

/// A write of a recognizer's state.
struct StateWrite {
    std::string key; ///< without a domain
    PropertyValue value;
};

/// Any state with any value: usual ones, 0, negative ones, NaN, infinities, texts. Half of the writes take
/// back an earlier one.
[[nodiscard]] StateWrite oddStateWrite(Dice &dice);

} // namespace ZorvaTouch::Scripted
