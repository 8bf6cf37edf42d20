#pragma once

#include "Shared/Ports/Log.h"

#include <string>
#include <string_view>

namespace ZorvaTouch::Linux {

/// What makes records the same to those who count them: level, origin and text, in which any number stands
/// for every other. A number is a run of digits, or 0x with hexadecimal ones: "frame 5 -> 0x9f" and "frame 12
/// -> 7" are one cause. Texts that differ only beyond their first 256 characters, numbers as one, are too.
/// @param origin  Where the text comes from, such as subsystem and category.
/// @throws std::bad_alloc
[[nodiscard]] std::string logCause(Ports::LogLevel level, std::string_view origin, std::string_view text);

} // namespace ZorvaTouch::Linux
