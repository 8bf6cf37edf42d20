#pragma once

#include "Shared/HostEvent.h"
#include "Shared/Pixel.h"

#include <array>
#include <cstddef>
#include <optional>
#include <string_view>

namespace ZorvaTouch::Tools {

/// What an event tells the host.
enum class Gesture {
    MayBegin,
    HoldStart,
    HoldChange,
    HoldEnd,
    Tap,
    Cancel,
    Reset, ///< the device has reset
};
inline constexpr std::size_t kGestureCount = 7;
inline constexpr std::array<Gesture, kGestureCount> kGestures{
    Gesture::MayBegin, Gesture::HoldStart, Gesture::HoldChange, Gesture::HoldEnd,
    Gesture::Tap,      Gesture::Cancel,    Gesture::Reset};

/// Which gesture an event is, told by its mask and phase; nothing for an event that the recognizer does not
/// make.
[[nodiscard]] std::optional<Gesture> gestureOf(const HostEvent &event) noexcept;

/// Region in a gesture's event; `kPixelRegionNone` for a reset and for a code that is no region.
[[nodiscard]] PixelRegion regionOf(const HostEvent &event) noexcept;

/// A gesture's name in the text form, "may-begin".
[[nodiscard]] std::string_view nameOf(Gesture gesture) noexcept;
/// A region's name in the text form, "volume-up".
[[nodiscard]] std::string_view nameOf(PixelRegion region) noexcept;

/// The gesture or region of that name; nothing if there is none.
[[nodiscard]] std::optional<Gesture> gestureNamed(std::string_view name) noexcept;
[[nodiscard]] std::optional<PixelRegion> regionNamed(std::string_view name) noexcept;

} // namespace ZorvaTouch::Tools
