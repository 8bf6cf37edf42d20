#pragma once

#include "Shared/Pixel.h"
#include "Tools/Stimulus/EventNames.h"

#include <string_view>

namespace ZorvaTouch::Tools {

/// What a host with a player and an assistant does about a gesture.
enum class HostAction {
    None,
    PlayPause,
    VolumeDown,
    VolumeUp,
    Assistant,        ///< listens until the hold ends or moves
    RepeatVolumeDown, ///< again and again until the hold ends or moves
    RepeatVolumeUp,
    Stop, ///< what the hold began
};

/// @param region  The gesture's.
[[nodiscard]] HostAction actionFor(Gesture gesture, PixelRegion region) noexcept;

/// For programs, "volume-up-repeat".
[[nodiscard]] std::string_view nameOf(HostAction action) noexcept;
/// For people, "volume up ..."; the dots stand for again and again.
[[nodiscard]] std::string_view titleOf(HostAction action) noexcept;

} // namespace ZorvaTouch::Tools
