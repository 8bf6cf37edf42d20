#pragma once

#include "Shared/RecordingContainer.h"
#include "Shared/Util/PropertyValue.h"
#include "Tools/Cli/Environment.h"
#include "Tools/Cli/GestureCounts.h"
#include "Tools/Cli/Progress.h"
#include "Tools/Stimulus/Replay.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <span>
#include <string>

namespace ZorvaTouch::Tools {

inline constexpr std::size_t kInputKindCount = 6;

/// How regularly images were recorded: from the time stamps of each two images that follow one another
/// without an image missing between them.
struct ImageIntervals {
    std::int64_t medianNs = 0;
    std::int64_t jitterNs = 0; ///< 95 of 100 intervals differ from the median by this or less
    std::int64_t longestNs = 0;

    /// @param intervalsNs  At least one. Sorted by the call.
    [[nodiscard]] static ImageIntervals measure(std::span<std::int64_t> intervalsNs);
    /// Images a second; nothing if the median is no time.
    [[nodiscard]] std::optional<double> ratePerSecond() const;
};

/// What a recording holds.
struct RecordingInfo {
    std::uint64_t version = 0;                              ///< of the container
    std::array<std::size_t, kInputKindCount> frameCounts{}; ///< by `InputKind`
    std::uint64_t durationNs = 0;                           ///< from the earliest to the latest frame
    std::optional<ImageIntervals> intervals;
    std::size_t disjointCount = 0;
    std::map<std::string, PropertyValue, std::less<>> states; ///< last value written, by key
    GestureCounts gestures;                                   ///< of a replay with the recognizer's defaults

    [[nodiscard]] std::size_t frames() const noexcept;
    [[nodiscard]] std::size_t countOf(InputKind kind) const noexcept {
        return frameCounts[static_cast<std::size_t>(kind)];
    }
};

/// Replays the recording and takes notes.
/// @param progress  Shows a part "replaying".
[[nodiscard]] RecordingInfo inspectRecording(RecordingContainer recording, Environment &environment,
                                             Progress &progress);

} // namespace ZorvaTouch::Tools
