#pragma once

#include <string_view>

namespace ZorvaTouch {

/// Subsystem of every log handle.
inline constexpr std::string_view kLogSubsystem = "org.zorva.hid.ZorvaTouch";
/// Category of the recognizer's log.
inline constexpr std::string_view kLogCategoryAlgs = "Algs";

} // namespace ZorvaTouch
