#pragma once

#include <cstdint>

namespace ZorvaTouch::Tools {

/// What a signal that ends the daemon does.
enum class EndStep {
    Begin,       ///< the end begins
    Acknowledge, ///< the end is in progress: one line in the log, nothing changes
    Hurry,       ///< recordings that are not saved yet are left out
    Ignore,      ///< as `Acknowledge`, without a line
};

/// Decides what each signal that ends the daemon does. Service managers and terminals send more than one, so
/// a second signal changes nothing; a third shows that a user is waiting.
///
/// | Signal | Step |
/// |---|---|
/// | the first | `Begin` |
/// | a further one | `Acknowledge` |
/// | one at most 2 s after one that was acknowledged | `Hurry` |
/// | all after that | `Ignore` |
///
/// Threads: one.
class EndRequests {
public:
    static constexpr std::uint64_t kHurryWithinNs = 2'000'000'000;

    /// @param nowNs  Of a clock that does not go back.
    [[nodiscard]] EndStep take(std::uint64_t nowNs) noexcept;

private:
    enum class State { Serving, Ending, Acknowledged, Hurried };

    State _state = State::Serving;
    std::uint64_t _acknowledgedNs = 0;
};

} // namespace ZorvaTouch::Tools
