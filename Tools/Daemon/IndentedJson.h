#pragma once

#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// Puts each value of a JSON text on a line of its own, indented by two blanks a level, and ends the last
/// line.
/// @param json  One well-formed value without white space.
[[nodiscard]] std::string indentedJson(std::string_view json);

/// The same JSON value with the control characters that JSON allows in strings, U+007F to U+009F, as
/// `\u009b`: shown on a terminal they do nothing to it.
/// @param json  Well-formed JSON text.
[[nodiscard]] std::string withoutControls(std::string_view json);

} // namespace ZorvaTouch::Tools
