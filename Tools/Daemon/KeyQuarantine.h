#pragma once

#include "Tools/Daemon/KeyMapper.h"

#include <cstddef>
#include <cstdint>
#include <vector>

namespace ZorvaTouch::Tools {

/// Rate limit for the key presses of one surface, so that a defective or hostile device does not flood the
/// desktop.
///
/// Within any second at most `limit` presses pass. The next one starts the quarantine: no press passes until
/// none has been attempted for the quiet period. The first press after that passes and ends the quarantine.
/// The release of a press that did not pass does not pass either, so each key that went down goes up, once.
///
/// Threads: one at a time. No clock: times come with the changes.
class KeyQuarantine {
public:
    /// Presses per second. A hand makes fewer than 15, also with several fingers.
    static constexpr unsigned kDefaultLimit = 20;
    static constexpr unsigned kHighestLimit = 1000;
    static constexpr std::uint64_t kWindowNs = 1'000'000'000;
    static constexpr std::uint64_t kQuietNs = 2'000'000'000;

    enum class Transition { None, Begins, Ends };
    struct Result {
        KeyChanges changes; ///< what passes
        Transition transition = Transition::None;
    };

    /// @param limit  Presses per second, at most `kHighestLimit`; 0: no limit.
    /// @throws std::bad_alloc
    explicit KeyQuarantine(unsigned limit) : _passed(limit) {}

    /// @param changes  As `KeyMapper` makes them: at most one press, after the release of what is down.
    /// @param timeNs   When they are due. A time before that of an earlier call counts as the earlier one.
    [[nodiscard]] Result filter(const KeyChanges &changes, std::uint64_t timeNs) noexcept;

    /// Ends the quarantine without a press.
    /// @return Whether there was one.
    bool end() noexcept;

    /// Presses that did not pass since the quarantine began; after its end, until the next one begins.
    [[nodiscard]] std::uint64_t suppressed() const noexcept { return _suppressed; }
    /// The key whose press has passed and whose release has not; `kNoKey` if there is none.
    [[nodiscard]] KeyCode keyDown() const noexcept { return _keyDown; }

private:
    [[nodiscard]] Transition judgePress() noexcept;
    [[nodiscard]] bool exceedsLimit() const noexcept;
    void notePassed() noexcept;

    std::vector<std::uint64_t> _passed; ///< times of the newest presses that passed, a ring; empty: no limit
    std::size_t _passedCount = 0;       ///< of all presses that passed
    std::uint64_t _nowNs = 0;           ///< the latest time
    std::uint64_t _attemptNs = 0;       ///< of the latest press, passed or not
    std::uint64_t _suppressed = 0;
    KeyCode _keyDown = kNoKey;
    bool _isActive = false;
};

} // namespace ZorvaTouch::Tools
