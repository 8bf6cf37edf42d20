#include "Tools/Cli/GestureLook.h"

#include <array>

namespace ZorvaTouch::Tools {
namespace {

/// In the order of `Gesture`.
constexpr std::array<GestureLook, kGestureCount> kGestureLooks{{{"may begin", Colour::None},
                                                                {"hold", Colour::Cyan},
                                                                {"hold moves", Colour::Cyan},
                                                                {"hold ends", Colour::Cyan},
                                                                {"tap", Colour::Green},
                                                                {"touch withdrawn", Colour::Yellow},
                                                                {"device reset", Colour::Magenta}}};

/// In the order of the region codes.
constexpr std::array<std::string_view, kPixelRegionCount> kRegionTitles{"none", "play/pause", "volume down",
                                                                        "volume up"};

} // namespace

const GestureLook &lookOf(Gesture gesture) noexcept {
    return kGestureLooks[static_cast<std::size_t>(gesture)];
}

std::string_view titleOf(PixelRegion region) noexcept { return kRegionTitles[region]; }

} // namespace ZorvaTouch::Tools
