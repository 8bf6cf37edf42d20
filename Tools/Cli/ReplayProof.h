#pragma once

#include "Shared/FrameList.h"
#include "Tools/Cli/EventHistory.h"

#include <cstddef>
#include <cstdint>
#include <limits>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {

/// A time that never comes: there was nothing to compare.
inline constexpr std::uint64_t kNothingCompared = std::numeric_limits<std::uint64_t>::max();

/// Where what a host heard and what a replay gives first differ.
struct ReplayDifference {
    std::size_t index = 0;       ///< of the compared events, from 0
    std::string heard, replayed; ///< each event with its time; empty: there is none
};

/// What came of replaying what a service has recorded.
struct ReplayProof {
    std::size_t reports = 0; ///< in the recording
    std::size_t events = 0;  ///< compared
    /// The recording has lost its beginning: only events from this time on were compared, the first touch
    /// that begins after the cut, or a later one: as long as the recognizer may have remembered what the
    /// recording no longer has, touches that the two see differently do not count, nor those before them. As
    /// the recording's time stamps; `kNothingCompared` if there is no such touch.
    std::optional<std::uint64_t> fromNs;
    std::optional<ReplayDifference> difference;
};

/// Replays a recording into a recognizer of its own and compares its events, to their last field and their
/// time, with those that a host has heard.
///
/// @param recording  A service's own, in order of time; its time stamps are nanoseconds of the host's clock.
/// @param history    With time stamps of the same clock in nanoseconds.
[[nodiscard]] ReplayProof proveReplay(const FrameList &recording, const EventHistory &history);

} // namespace ZorvaTouch::Tools
