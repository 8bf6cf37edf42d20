#pragma once

#include "Tools/Daemon/KeyMap.h"
#include "Tools/Stimulus/EventNames.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

/// What the daemon shows people when it presses no keys: a line for each key that would change.
namespace ZorvaTouch::Tools {

struct ShownKey {
    std::uint64_t timeNs = 0; ///< since the daemon began
    PixelRegion region = kPixelRegionNone;
    std::optional<Gesture> gesture; ///< nothing: no gesture's doing, as when the surface is gone
    KeyChange change;
    std::string_view surface; ///< at the end of the line; empty where there is only one
};

/// The line above the first one, with its line break.
[[nodiscard]] std::string keyHeading(bool usesColour);

/// A line with its line break: "    1.234 s  volume up     tap              KEY_VOLUMEUP        down".
/// Characters that control a terminal are escaped (`Util::printable`).
/// @throws std::bad_alloc
[[nodiscard]] std::string keyLine(const ShownKey &shown, bool usesColour);

/// Stands for lines that were lost, since the screen took no more.
[[nodiscard]] std::string droppedKeyLine(std::uint64_t lines);

} // namespace ZorvaTouch::Tools
