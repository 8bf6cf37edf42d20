#pragma once

#include <cstdint>
#include <limits>

/// Conversions from floating point to integers that are defined for every input: truncate toward zero,
/// saturate at the ends of the range, and turn NaN into 0.
namespace ZorvaTouch::Util {

[[nodiscard]] constexpr std::int32_t truncateToInt32(float value) noexcept {
    constexpr float kLimit = 2147483648.0f; // 2^31 is exact in single precision, INT32_MAX is not
    if (value > -kLimit && value < kLimit)
        return static_cast<std::int32_t>(value);
    if (value != value) // NaN
        return 0;
    return value > 0.0f ? std::numeric_limits<std::int32_t>::max() : std::numeric_limits<std::int32_t>::min();
}

[[nodiscard]] constexpr std::uint64_t truncateToUint64(double value) noexcept {
    if (value >= 18446744073709551616.0)
        return std::numeric_limits<std::uint64_t>::max();
    return value > 0.0 ? static_cast<std::uint64_t>(value) : 0; // NaN and negative values: 0
}

} // namespace ZorvaTouch::Util
