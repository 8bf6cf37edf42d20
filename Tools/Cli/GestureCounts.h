#pragma once

#include "Tools/Stimulus/EventNames.h"
#include "Tools/Stimulus/Replay.h"

#include <array>
#include <cstdint>
#include <string>

namespace ZorvaTouch::Tools {

/// Events by what they tell the host.
class GestureCounts {
public:
    void add(Gesture gesture) noexcept { ++_counts[static_cast<std::size_t>(gesture)]; }
    void add(const ReplayedFrame &frame) noexcept;
    void add(const GestureCounts &other) noexcept;

    [[nodiscard]] std::uint64_t of(Gesture gesture) const noexcept {
        return _counts[static_cast<std::size_t>(gesture)];
    }
    /// Without the may-begins, which are no gesture yet.
    [[nodiscard]] std::uint64_t gestures() const noexcept;
    [[nodiscard]] bool empty() const noexcept;

    /// Appends those that are not 0: "may-begin 3, tap 2"; "none" if all are.
    void appendTo(std::string &text) const;
    /// Appends all of them as an object, {"may-begin":3,"hold-start":0,...}.
    void appendJsonTo(std::string &text) const;

private:
    std::array<std::uint64_t, kGestureCount> _counts{};
};

} // namespace ZorvaTouch::Tools
