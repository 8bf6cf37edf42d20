#include "Tools/Stimulus/EventNames.h"

#include <algorithm>
#include <cstdint>

namespace ZorvaTouch::Tools {
namespace {

/// How a gesture looks in an event, and what it is called.
struct GestureRow {
    Gesture gesture;
    std::string_view name;
    std::uint32_t eventMask;
    std::uint16_t phase;
};
/// In the order of `Gesture`, without the reset, which is an event of another type.
constexpr std::array<GestureRow, kGestureCount - 1> kDigitizerGestures{{
    {Gesture::MayBegin, "may-begin", 0, kEventPhaseMayBegin},
    {Gesture::HoldStart, "hold-start", kEventMaskHold, kEventPhaseBegan},
    {Gesture::HoldChange, "hold-change", kEventMaskHold, kEventPhaseChanged},
    {Gesture::HoldEnd, "hold-end", kEventMaskHold, kEventPhaseEnded},
    {Gesture::Tap, "tap", kEventMaskTap, kEventPhaseNone},
    {Gesture::Cancel, "cancel", 0, kEventPhaseCancelled},
}};
constexpr std::string_view kResetName = "reset";

/// In the order of the region codes.
constexpr std::array<std::string_view, kPixelRegionCount> kRegionNames{"none", "play/pause", "volume-down",
                                                                       "volume-up"};

} // namespace

std::optional<Gesture> gestureOf(const HostEvent &event) noexcept {
    if (event.vendorDefined())
        return Gesture::Reset;
    if (!event.digitizer())
        return std::nullopt;
    for (const GestureRow &row : kDigitizerGestures)
        if (row.eventMask == event.digitizer()->eventMask && row.phase == event.phase())
            return row.gesture;
    return std::nullopt;
}

PixelRegion regionOf(const HostEvent &event) noexcept {
    if (!event.digitizer())
        return kPixelRegionNone;
    for (std::uint32_t code = 0; code < kPixelRegionCount; ++code)
        if (event.digitizer()->y == static_cast<double>(code))
            return static_cast<PixelRegion>(code);
    return kPixelRegionNone;
}

std::string_view nameOf(Gesture gesture) noexcept {
    return gesture == Gesture::Reset ? kResetName
                                     : kDigitizerGestures[static_cast<std::size_t>(gesture)].name;
}

std::string_view nameOf(PixelRegion region) noexcept { return kRegionNames[region]; }

std::optional<Gesture> gestureNamed(std::string_view name) noexcept {
    const auto *const found = std::find_if(kGestures.begin(), kGestures.end(),
                                           [name](Gesture gesture) { return nameOf(gesture) == name; });
    return found == kGestures.end() ? std::nullopt : std::optional(*found);
}

std::optional<PixelRegion> regionNamed(std::string_view name) noexcept {
    const auto *const found = std::find(kRegionNames.begin(), kRegionNames.end(), name);
    if (found == kRegionNames.end())
        return std::nullopt;
    return static_cast<PixelRegion>(found - kRegionNames.begin());
}

} // namespace ZorvaTouch::Tools
