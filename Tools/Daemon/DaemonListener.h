#pragma once

#include "Shared/HostEvent.h"
#include "Tools/Daemon/EventLines.h"
#include "Tools/Daemon/KeyMap.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// A surface as the daemon speaks of it.
struct SurfaceName {
    std::string id; ///< what it keeps when it is attached anew: serial number, or place; no two have the same
    std::string node; ///< "/dev/hidraw0", "sim:day"
    std::string name; ///< the device's own; may be empty
};

/// Hears what happens in the daemon; what a listener leaves out it does not care for.
///
/// Threads: gestures and keys on the key thread, everything else on the main thread; one listener hears of
///          both at the same time. Must not block: a key may be down.
class DaemonListener {
public:
    virtual ~DaemonListener() = default;

    /// @param reason  One line, where the state is `Lost` or `Failed`; empty otherwise.
    virtual void onSurface(const SurfaceName & /*surface*/, SurfaceState /*state*/,
                           std::string_view /*reason*/) noexcept {}
    /// An event of the plug-in, before the keys that it moves.
    virtual void onEvent(const SurfaceName & /*surface*/, const HostEvent & /*event*/) noexcept {}
    /// The keyboard's key went down or up.
    /// @param cause   The event whose doing it is; null for a surface's end.
    /// @param isSent  Whether there is a keyboard; else it would have.
    virtual void onKey(const SurfaceName & /*surface*/, const HostEvent * /*cause*/, KeyChange /*change*/,
                       bool /*isSent*/) noexcept {}
    /// The surface's presses exceed the rate limit and do not reach the keyboard, or do so again. On the key
    /// thread.
    /// @param suppressed  Presses that did not reach it so far.
    virtual void onQuarantine(const SurfaceName & /*surface*/, bool /*begins*/,
                              std::uint64_t /*suppressed*/) noexcept {}
    virtual void onAccelerometer(const std::string & /*name*/, bool /*isUsed*/) noexcept {}
    virtual void onSleep(bool /*begins*/) noexcept {}
    virtual void onRecording(const SurfaceName & /*surface*/, const std::string & /*file*/,
                             std::size_t /*reports*/) noexcept {}
};

} // namespace ZorvaTouch::Tools
