#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <span>

namespace ZorvaTouch::KernelTests {

/// An accelerometer as a hub of sensors has it: what the kernel has set, when it samples, what it reads.
/// Times are ns of the monotonic clock, accelerations in 1/1000 g.
class SensorHub {
public:
    using Acceleration = std::array<std::int32_t, 3>; ///< x, y, z
    using FeatureReport = std::array<std::uint8_t, 9>;
    using InputReport = std::array<std::uint8_t, 13>;

    /// Report 1: reporting and power state, interval in ms, sensitivity.
    [[nodiscard]] FeatureReport featureReport() const noexcept;
    /// Sets them as the kernel says. @return Whether the report was one.
    bool set(std::span<const std::uint8_t> report, std::uint64_t now) noexcept;

    /// As after power on.
    void turnOff() noexcept;

    void setGravity(const Acceleration &gravity) noexcept { _gravity = gravity; }
    /// Adds to gravity for a while.
    void bump(const Acceleration &bump, std::uint64_t untilNs) noexcept;
    /// Report 1: x, y, z at this time.
    [[nodiscard]] InputReport inputReport(std::uint64_t now) const noexcept;

    /// When the next sample is due; nothing while it is off.
    [[nodiscard]] std::optional<std::uint64_t> dueNs() const noexcept { return _due; }
    /// Goes on to the next sample. Those that were missed are left out; the beat stays.
    void advance(std::uint64_t now) noexcept;

    [[nodiscard]] bool isOn() const noexcept;
    [[nodiscard]] std::uint32_t intervalMs() const noexcept { return _intervalMs; }

private:
    [[nodiscard]] std::uint64_t intervalNs() const noexcept;

    std::uint8_t _reporting = 1, _power = 6; ///< no events, power off
    std::uint32_t _intervalMs = 50;
    std::uint16_t _sensitivity = 0;
    Acceleration _gravity{0, 0, 1000}, _bump{};
    std::uint64_t _bumpUntilNs = 0;
    std::optional<std::uint64_t> _due;
};

} // namespace ZorvaTouch::KernelTests
