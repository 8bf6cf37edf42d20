#include "Synth/Random.h"

namespace ZorvaTouch::Synth {

std::uint64_t Random::next() noexcept {
    _state += 0x9E3779B97F4A7C15u;
    std::uint64_t mixed = _state;
    mixed = (mixed ^ (mixed >> 30)) * 0xBF58476D1CE4E5B9u;
    mixed = (mixed ^ (mixed >> 27)) * 0x94D049BB133111EBu;
    return mixed ^ (mixed >> 31);
}

double Random::uniform() noexcept { return static_cast<double>(next() >> 11) * 0x1.0p-53; }

double Random::between(double low, double high) noexcept { return low + (high - low) * uniform(); }

double Random::gaussian() noexcept {
    constexpr double kHalf = 12 * 65535 / 2.0; // mean of twelve 16-bit numbers' sum
    std::uint64_t sum = 0;
    for (int word = 0; word < 3; ++word)
        for (std::uint64_t bits = next(), part = 0; part < 4; ++part, bits >>= 16)
            sum += bits & 0xFFFFu;
    // A uniform number has variance 1/12, twelve of them 1.
    return (static_cast<double>(sum) - kHalf) * 0x1.0p-16;
}

} // namespace ZorvaTouch::Synth
