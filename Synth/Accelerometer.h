#pragma once

#include "Shared/Util/PropertyValue.h"
#include "Synth/Contact.h"
#include "Synth/Parameters.h"
#include "Synth/Random.h"

#include <cstdint>
#include <optional>
#include <span>

namespace ZorvaTouch::Synth {

inline constexpr const char *kAccelKey = "Accel";

/// The accelerometer in the same housing: gravity, noise, and a bump into the sensor as each contact begins.
class Accelerometer {
public:
    Accelerometer(const Parameters &parameters, Random random) noexcept;

    /// The time of the next sample up to `time`, once; nothing if there is none, as when the rate is 0.
    [[nodiscard]] std::optional<Microseconds> takeSample(Microseconds time) noexcept;

    /// Samples once.
    /// @return {"X", "Y", "Z"}: 32-bit floats in g, multiples of 1/512.
    [[nodiscard]] PropertyValue measure(std::span<const Contact> contacts, Microseconds time);

private:
    [[nodiscard]] float read(double acceleration) noexcept;

    Parameters _parameters;
    Random _random;
    double _x, _y, _z; ///< gravity, g
    std::uint64_t _samples = 0;
};

} // namespace ZorvaTouch::Synth
