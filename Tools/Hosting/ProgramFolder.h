#pragma once

#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// The path of a file that lies where it lies from the program's own folder, built and installed alike.
/// @param relative  "../lib/zorvatouch/ZorvaTouchHIDService.so"
[[nodiscard]] std::string besideProgram(std::string_view relative);

} // namespace ZorvaTouch::Tools
