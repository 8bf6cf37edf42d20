#pragma once

#include <cstdint>

/// Little-endian loads, spelled out so that the host's byte order never matters.
namespace ZorvaTouch::Util {

[[nodiscard]] constexpr std::uint16_t loadLittle16(const std::uint8_t *bytes) noexcept {
    return static_cast<std::uint16_t>(bytes[0] | (bytes[1] << 8));
}

[[nodiscard]] constexpr std::uint32_t loadLittle32(const std::uint8_t *bytes) noexcept {
    return static_cast<std::uint32_t>(bytes[0]) | (static_cast<std::uint32_t>(bytes[1]) << 8) |
           (static_cast<std::uint32_t>(bytes[2]) << 16) | (static_cast<std::uint32_t>(bytes[3]) << 24);
}

constexpr void storeLittle16(std::uint8_t *bytes, std::uint16_t value) noexcept {
    bytes[0] = static_cast<std::uint8_t>(value);
    bytes[1] = static_cast<std::uint8_t>(value >> 8);
}

constexpr void storeLittle32(std::uint8_t *bytes, std::uint32_t value) noexcept {
    storeLittle16(bytes, static_cast<std::uint16_t>(value));
    storeLittle16(bytes + 2, static_cast<std::uint16_t>(value >> 16));
}

} // namespace ZorvaTouch::Util
