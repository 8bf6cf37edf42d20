#pragma once

#include "Shared/Pixel.h"
#include "Tools/Cli/Layout.h"
#include "Tools/Stimulus/EventNames.h"

#include <string_view>

/// How gestures are shown to people.
namespace ZorvaTouch::Tools {

struct GestureLook {
    std::string_view name; ///< "hold moves"
    Colour colour;
};
[[nodiscard]] const GestureLook &lookOf(Gesture gesture) noexcept;

/// A region's name, "volume up".
[[nodiscard]] std::string_view titleOf(PixelRegion region) noexcept;

} // namespace ZorvaTouch::Tools
