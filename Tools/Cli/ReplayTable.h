#pragma once

#include "Shared/Pixel.h"
#include "Tools/Cli/Environment.h"
#include "Tools/Cli/GestureCounts.h"
#include "Tools/Cli/ReplayPrinter.h"

#include <cstdint>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {

/// Prints a replay for a person: a line for each gesture, then a summary.
class ReplayTable final : public ReplayPrinter {
public:
    /// @param environment  Borrowed. Its output is written to.
    /// @param describe     Also the recognizer's descriptions, under each gesture.
    ReplayTable(Environment &environment, bool describe)
        : _output(environment.output), _usesColour(environment.usesColour), _describe(describe) {}

    void begin(const std::string &title, const Replay &replay) override;
    void print(const Replay &replay) override;
    void end(const Replay &replay) override;
    void finish() override;

private:
    /// Where the touch in progress began.
    struct TouchStart {
        std::uint32_t timeMs;      ///< sensor's clock
        std::uint64_t timestampNs; ///< as recorded
    };

    void printGesture(const Replay &replay, const HostEvent &event, Gesture gesture);
    void printRow(const Replay &replay, const HostEvent &event, Gesture gesture);
    void printTitleRow();
    void printDescriptions(const Replay &replay);
    void printCounters(const Replay &replay);
    [[nodiscard]] std::string durationOf(const ReplayedFrame &frame) const;
    [[nodiscard]] std::string regionsOf(const HostEvent &event, Gesture gesture) const;

    Output &_output;
    const bool _usesColour;
    const bool _describe;
    // Of the recording being played.
    std::optional<TouchStart> _touch;
    PixelRegion _holdRegion = kPixelRegionNone;
    GestureCounts _counts;
    bool _hasRows = false;
    // Of all recordings.
    std::size_t _recordingCount = 0;
    GestureCounts _totals;
};

} // namespace ZorvaTouch::Tools
