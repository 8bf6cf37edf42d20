#pragma once

#include "Shared/InputReport.h"
#include "Shared/Pixel.h"
#include "Tools/Cli/HostAction.h"
#include "Tools/Stimulus/EventNames.h"

#include <cstdint>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {

/// A gesture that a host has heard, and what it does about it.
struct LiveGesture {
    Gesture gesture;
    PixelRegion region;                      ///< none for a withdrawn touch and a reset
    std::uint64_t timeNs;                    ///< since the run began
    std::optional<std::uint64_t> durationMs; ///< since the touch began; nothing for a reset
    HostAction action;
    std::string finger; ///< what really happened, "tap volume up"; empty if unknown
};

/// Shows a run as it goes.
class LivePrinter {
public:
    virtual ~LivePrinter() = default;

    virtual void print(const LiveGesture &gesture) = 0;
    /// Something happened of which no gesture told.
    /// @param timeNs    Its end.
    /// @param isMissed  There should have been one.
    virtual void printSilence(std::uint64_t timeNs, const std::string &what, bool isMissed) = 0;
    /// Some time has passed. @param image  The device's latest.
    virtual void refresh(std::uint64_t timeNs, const std::optional<InputReport::Image> &image) = 0;
    /// Leaves the screen to others, until the next call.
    virtual void clear() = 0;
};

} // namespace ZorvaTouch::Tools
