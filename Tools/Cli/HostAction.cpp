#include "Tools/Cli/HostAction.h"

#include <array>
#include <cstddef>

namespace ZorvaTouch::Tools {
namespace {

/// By region, in the order of the codes.
using RegionActions = std::array<HostAction, kPixelRegionCount>;
constexpr RegionActions kTapActions{HostAction::None, HostAction::PlayPause, HostAction::VolumeDown,
                                    HostAction::VolumeUp};
constexpr RegionActions kHoldActions{HostAction::None, HostAction::Assistant, HostAction::RepeatVolumeDown,
                                     HostAction::RepeatVolumeUp};

struct ActionText {
    std::string_view name, title;
};
/// In the order of `HostAction`.
constexpr std::array<ActionText, 8> kActionTexts{{{"none", "nothing"},
                                                  {"play/pause", "play/pause"},
                                                  {"volume-down", "volume down"},
                                                  {"volume-up", "volume up"},
                                                  {"assistant", "assistant"},
                                                  {"volume-down-repeat", "volume down ..."},
                                                  {"volume-up-repeat", "volume up ..."},
                                                  {"stop", "stop"}}};

const ActionText &textOf(HostAction action) { return kActionTexts[static_cast<std::size_t>(action)]; }

} // namespace

HostAction actionFor(Gesture gesture, PixelRegion region) noexcept {
    switch (gesture) {
    case Gesture::Tap:
        return kTapActions[region];
    case Gesture::HoldStart:
    case Gesture::HoldChange:
        return kHoldActions[region];
    case Gesture::HoldEnd:
        return HostAction::Stop;
    case Gesture::MayBegin:
    case Gesture::Cancel:
    case Gesture::Reset:
        break;
    }
    return HostAction::None;
}

std::string_view nameOf(HostAction action) noexcept { return textOf(action).name; }

std::string_view titleOf(HostAction action) noexcept { return textOf(action).title; }

} // namespace ZorvaTouch::Tools
