#pragma once

#include "Tools/Cli/EventHistory.h"
#include "Tools/Cli/FingerTruth.h"
#include "Tools/Cli/GestureCounts.h"
#include "Tools/Cli/LivePrinter.h"
#include "Tools/Cli/LiveSession.h"

#include <cstdint>
#include <optional>

namespace ZorvaTouch::Tools {

/// Makes gestures of the events that a host hears, counts and keeps them, and has them shown.
class LiveWatch final : public LiveListener {
public:
    /// @param printer  Borrowed; null: nothing is shown.
    /// @param truth    Borrowed; null: nobody knows what the finger does.
    LiveWatch(LivePrinter *printer, FingerTruth *truth) : _printer(printer), _truth(truth) {}

    void heard(const HostEvent &event, std::uint64_t timeNs) override;
    void passed(std::uint64_t timeNs, const std::optional<InputReport::Image> &image) override;

    void makeRoomForLog() override;

    [[nodiscard]] const GestureCounts &counts() const noexcept { return _counts; }
    [[nodiscard]] const EventHistory &history() const noexcept { return _history; }

private:
    [[nodiscard]] LiveGesture describe(const HostEvent &event, Gesture gesture, std::uint64_t timeNs);

    LivePrinter *const _printer;
    FingerTruth *const _truth;
    GestureCounts _counts;
    EventHistory _history;
    std::optional<std::uint64_t> _touchStartNs; ///< of the touch in progress
};

} // namespace ZorvaTouch::Tools
