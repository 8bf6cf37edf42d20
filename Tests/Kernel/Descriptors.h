#pragma once

#include <cstdint>
#include <span>

/// What the emulated devices say of themselves: HID report descriptors.
namespace ZorvaTouch::KernelTests {

/// The touch surface: input reports 1 (72 bytes beside the ID) and 2 (9), feature report 31 (4), and the
/// debug reports 04, 10 to 13, 1d, 32, 3b, 3c and 3f (32). A vendor's page: nothing but hidraw takes it.
[[nodiscard]] std::span<const std::uint8_t> surfaceDescriptor() noexcept;

/// The same reports 1, 2 and 31 declared with one byte each, so that the kernel lets a report of any other
/// length through as well.
[[nodiscard]] std::span<const std::uint8_t> looseSurfaceDescriptor() noexcept;

/// A hub of sensors with an accelerometer in units of 1/1000 g. `SensorHub` has its reports.
[[nodiscard]] std::span<const std::uint8_t> accelerometerDescriptor() noexcept;

} // namespace ZorvaTouch::KernelTests
