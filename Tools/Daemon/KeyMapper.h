#pragma once

#include "Shared/HostEvent.h"
#include "Tools/Daemon/KeyMap.h"

#include <array>
#include <cstddef>

namespace ZorvaTouch::Tools {

/// The changes that one event makes, in order; at most two.
class KeyChanges {
public:
    using value_type = KeyChange;
    using const_iterator = const KeyChange *;

    [[nodiscard]] const_iterator begin() const noexcept { return _changes.data(); }
    [[nodiscard]] const_iterator end() const noexcept { return _changes.data() + _size; }
    [[nodiscard]] std::size_t size() const noexcept { return _size; }
    [[nodiscard]] bool empty() const noexcept { return _size == 0; }

    /// There must be less than two.
    void add(KeyChange change) noexcept { _changes[_size++] = change; }

private:
    std::array<KeyChange, 2> _changes{};
    std::size_t _size = 0;
};

/// What ends a surface's touches beside its own events.
enum class SurfaceEnd {
    Suspended,   ///< the machine goes to sleep; the next touch counts again
    Unscheduled, ///< this and the following are for good
    DeviceGone,
    Stopped, ///< the daemon is
};

/// Turns the events of one surface into presses and releases of keys, by the table in `Docs/Keys.md`.
///
/// Whatever comes in whatever order: a touch acts at most once, only one key is down at a time, and each key
/// that went down goes up again at the latest with the next may-begin or end. Changes that nobody carries out
/// are lost, so a mapper is told its end before it goes.
///
/// One for each time that a surface is scheduled. Threads: one at a time.
class KeyMapper {
public:
    enum class State {
        Idle,     ///< no touch, or one that has acted or was withdrawn
        Touching, ///< a touch that may still act
        Holding,  ///< a hold goes on; a key is down if the map has one for its region
        Over,     ///< the surface is gone: whatever was still on its way does nothing
    };

    explicit KeyMapper(const KeyMap &map) noexcept : _map(map) {}

    [[nodiscard]] KeyChanges handle(const HostEvent &event) noexcept;
    [[nodiscard]] KeyChanges handle(SurfaceEnd end) noexcept;

    [[nodiscard]] State state() const noexcept { return _state; }
    /// The key that is down; `kNoKey` if none is.
    [[nodiscard]] KeyCode keyDown() const noexcept { return _keyDown; }

private:
    enum class Input : std::size_t;
    enum class Action;
    struct Decision;
    struct Table;

    [[nodiscard]] static Input inputOf(const HostEvent &event) noexcept;
    [[nodiscard]] KeyChanges decide(Input input, PixelRegion region) noexcept;
    /// Leaves this key down and no other.
    void hold(KeyCode code, KeyChanges &changes) noexcept;

    KeyMap _map;
    State _state = State::Idle;
    KeyCode _keyDown = kNoKey;
};

} // namespace ZorvaTouch::Tools
