#pragma once

#include <cstdint>
#include <string_view>

namespace ZorvaTouch::KernelTests {

/// The whole text as a decimal number.
/// @throws std::invalid_argument with the text, if it is none or too large.
[[nodiscard]] std::uint32_t numberFrom(std::string_view text);

} // namespace ZorvaTouch::KernelTests
