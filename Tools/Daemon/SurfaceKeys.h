#pragma once

#include "Plugin/ZorvaPlugIn.h"
#include "Shared/Util/Ticks.h"
#include "Tools/Daemon/KeyQuarantine.h"
#include "Tools/Daemon/Keyboard.h"

#include <atomic>
#include <functional>

namespace ZorvaTouch::Tools {

/// The rate limit for each surface's keys.
struct KeyLimit {
    unsigned pressesPerSecond = 0;                    ///< 0: no limit
    Util::TickConverter ticks{Ports::TimeBase{1, 1}}; ///< of the events' time stamps
};

/// What one surface does to the keyboard from one schedule to the next: the target of its plug-in's events.
///
/// Threads: the key thread, but for `isIdle`.
class SurfaceKeys {
public:
    /// @param keyboard, listener  Borrowed.
    /// @param onHeld  Called when a key is held from now on; may be empty.
    SurfaceKeys(SurfaceName surface, const KeyMap &map, Keyboard &keyboard, DaemonListener &listener,
                std::function<void()> onHeld = {}, KeyLimit limit = {});

    /// A `ZorvaEventCallback`; the target is one of these.
    static void receive(void *target, void *refcon, void *sender, const ZorvaEvent *event,
                        std::uint32_t options) noexcept;

    /// Lets go of what is down, for one of these reasons.
    void end(SurfaceEnd end) noexcept;

    /// Whether no touch goes on that may still do something.
    ///
    /// Threads: any.
    [[nodiscard]] bool isIdle() const noexcept { return _isIdle; }

private:
    void handle(const HostEvent &event) noexcept;
    void tellQuarantine(bool begins) noexcept;
    void apply(const HostEvent *cause, const KeyChanges &changes) noexcept;

    const SurfaceName _surface;
    KeyMapper _mapper;
    KeyQuarantine _quarantine;
    const Util::TickConverter _ticks;
    Keyboard &_keyboard;
    DaemonListener &_listener;
    const std::function<void()> _onHeld;
    bool _isHeld = false;
    std::atomic<bool> _isIdle{true};
};

} // namespace ZorvaTouch::Tools
