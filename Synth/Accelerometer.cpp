#include "Synth/Accelerometer.h"

#include <algorithm>
#include <cmath>

namespace ZorvaTouch::Synth {
namespace {

constexpr double kStepsPerG = 512;
constexpr Microseconds kBumpLength = 40'000;
constexpr double kHardAttack = 30'000; ///< us; slower contacts bump less

/// Rises to 1 in the first third of the bump and dies away: 27/4 u (1 - u)^2.
double bumpShape(Microseconds time) noexcept {
    const double u = static_cast<double>(time) / static_cast<double>(kBumpLength);
    return 6.75 * u * (1 - u) * (1 - u);
}

double bumpOf(const Contact &contact, Microseconds time) noexcept {
    if (time < contact.start || time >= contact.start + kBumpLength)
        return 0;
    const double hardness = std::min(kHardAttack / static_cast<double>(contact.attack + 1), 1.0);
    return contact.pressure * hardness * bumpShape(time - contact.start);
}

} // namespace

Accelerometer::Accelerometer(const Parameters &parameters, Random random) noexcept
    : _parameters(parameters), _random(random) {
    double length = 0;
    do { // a direction is a point in the unit ball, and not too near to its middle
        _x = _random.between(-1, 1);
        _y = _random.between(-1, 1);
        _z = _random.between(-1, 1);
        length = std::sqrt(_x * _x + _y * _y + _z * _z);
    } while (length > 1 || length < 0.1);
    _x /= length;
    _y /= length;
    _z /= length;
}

std::optional<Microseconds> Accelerometer::takeSample(Microseconds time) noexcept {
    if (_parameters.accelRate <= 0)
        return std::nullopt;
    const auto next = static_cast<Microseconds>(static_cast<double>(_samples) * 1e6 / _parameters.accelRate);
    if (next > time)
        return std::nullopt;
    ++_samples;
    return next;
}

PropertyValue Accelerometer::measure(std::span<const Contact> contacts, Microseconds time) {
    double bump = 0;
    for (const Contact &contact : contacts)
        bump += bumpOf(contact, time);
    const float x = read(_x);
    const float y = read(_y);
    const float z = read(_z - _parameters.accelBump * bump);
    return PropertyValue::Dictionary{{"X", x}, {"Y", y}, {"Z", z}};
}

float Accelerometer::read(double acceleration) noexcept {
    const double noisy = acceleration + _parameters.accelNoise * _random.gaussian();
    return static_cast<float>(std::floor(noisy * kStepsPerG + 0.5) / kStepsPerG);
}

} // namespace ZorvaTouch::Synth
