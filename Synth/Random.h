#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace ZorvaTouch::Synth {

/// Random numbers that are the same on every machine: SplitMix64, and only operations that are rounded the
/// same everywhere on top of it.
///
/// Draws that happen in one expression need an order: braces keep it, function arguments do not.
class Random {
public:
    explicit Random(std::uint64_t seed) noexcept : _state(seed) {}

    /// A generator of its own, whose numbers do not move when others draw more or fewer.
    [[nodiscard]] Random split() noexcept { return Random(next()); }

    [[nodiscard]] std::uint64_t next() noexcept;
    /// 0 up to but not including 1, in steps of 2^-53.
    [[nodiscard]] double uniform() noexcept;
    [[nodiscard]] double between(double low, double high) noexcept;
    /// 0 to `count` - 1. The bias of the remainder is at most `count` / 2^64.
    [[nodiscard]] std::size_t below(std::size_t count) noexcept { return next() % count; }
    [[nodiscard]] bool chance(double probability) noexcept { return uniform() < probability; }
    /// Mean 0, standard deviation 1, nearly normal: the sum of twelve uniform numbers. Never beyond +-6.
    [[nodiscard]] double gaussian() noexcept;

    template <typename T, std::size_t Count>
    [[nodiscard]] const T &pick(const std::array<T, Count> &choices) noexcept {
        return choices[below(Count)];
    }

private:
    std::uint64_t _state;
};

} // namespace ZorvaTouch::Synth
