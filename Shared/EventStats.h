#pragma once

#include "Shared/Util/PropertyValue.h"

#include <cstdint>

namespace ZorvaTouch {

class HandStats;

/// Counts the gestures that were dispatched and those that were rejected or suppressed, since the last
/// `Reset`.
///
/// Every count follows from the flags of `HandStats` alone: it tells what the touch model decided, however
/// the events were delivered. A hold counts one increment per frame while it lasts, not one per change event.
struct EventStats {
    std::uint64_t numTaps = 0;
    std::uint64_t numBeginHold = 0;
    std::uint64_t numIncrementHold = 0; ///< frames of a continuing hold
    std::uint64_t numEndHold = 0;
    std::uint64_t numVolumeUp = 0; ///< taps by region
    std::uint64_t numVolumeDown = 0;
    std::uint64_t numPlayPause = 0;
    std::uint64_t numKeloCall = 0;          ///< holds begun in the play/pause region
    std::uint64_t numKeloCallIncrement = 0; ///< frames of a continuing hold there
    std::uint64_t numVolumeIncrement = 0;   ///< hold frames, begun or continuing, in the volume-up region
    std::uint64_t numVolumeDecrement = 0;   ///< likewise, volume down
    std::uint64_t numRejectedTap = 0;
    std::uint64_t numRejectedBeginHold = 0;     ///< first frames of a suppressed hold
    std::uint64_t numRejectedIncrementHold = 0; ///< further frames of a suppressed hold
    std::uint64_t numRejectedEndHold = 0;
    std::uint64_t numRejectedVolumeUp = 0; ///< rejected taps by region
    std::uint64_t numRejectedVolumeDown = 0;
    std::uint64_t numRejectedPlayPause = 0;
    std::uint64_t numRejectedKeloCall = 0;          ///< first suppressed-hold frames in the play/pause region
    std::uint64_t numRejectedKeloCallIncrement = 0; ///< further suppressed-hold frames there
    std::uint64_t numRejectedVolumeIncrement = 0;   ///< suppressed-hold frames in the volume-up region
    std::uint64_t numRejectedVolumeDecrement = 0;   ///< likewise, volume down
    std::uint64_t numSuppressed2Holding = 0;        ///< suppressed holds that became holds
    std::uint64_t numHolding2Suppressed = 0;        ///< holds that became suppressed; 0 unless suppression is
                                                    ///< switched off during a suppressed hold

    void Reset() noexcept { *this = EventStats(); }

    /// Counts one frame. Called once per frame, after the hand state and the frame's event are decided.
    void update(const HandStats &hand) noexcept;

    /// All counters, as {"Dispatched": {12 numbers}, "Rejected": {12 numbers}}, each under its name.
    [[nodiscard]] PropertyValue statsDictionary() const;

private:
    void countSuppressedFrame(const HandStats &hand) noexcept;
    void countHoldFrame(const HandStats &hand) noexcept;
    void countRejectedTap(const HandStats &hand) noexcept;
    void countTap(const HandStats &hand) noexcept;
};

} // namespace ZorvaTouch
