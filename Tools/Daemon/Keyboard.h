#pragma once

#include "Host/Linux/KeyOutput.h"
#include "Tools/Daemon/DaemonListener.h"
#include "Tools/Daemon/DaemonLog.h"
#include "Tools/Daemon/HeldKeys.h"
#include "Tools/Daemon/KeyMapper.h"

#include <functional>
#include <memory>
#include <string>

namespace ZorvaTouch::Tools {

/// Plugs a keyboard in. Throws what says in one line why there is none.
using KeyboardMaker = std::function<std::unique_ptr<Linux::KeyOutput>()>;

/// The daemon's one keyboard, which all surfaces press.
///
/// A key that cannot be released would repeat for ever; so a keyboard that fails is unplugged, whereupon the
/// system lets go of its keys, and another is plugged in.
///
/// Threads: the key thread; another before it is used there, and in the end.
class Keyboard {
public:
    /// Plugs it in, if that is possible now.
    /// @param maker     Empty: keys are shown, not pressed.
    /// @param listener  Borrowed.
    Keyboard(KeyboardMaker maker, DaemonListener &listener, DaemonLog log);
    /// Releases what is down.
    ~Keyboard();
    Keyboard(const Keyboard &) = delete;
    Keyboard &operator=(const Keyboard &) = delete;

    /// Carries out what one surface does.
    /// @param cause  The event whose doing it is; null for the surface's end.
    void apply(const SurfaceName &surface, const HostEvent *cause, const KeyChanges &changes) noexcept;

    /// The machine is about to sleep, or is awake: in between nothing is pressed, as nobody could release it.
    void sleep(bool begins) noexcept { _isAsleep = begins; }

    /// Tries to plug it in if that was not possible before.
    void plug() noexcept;

    /// Whether keys are pressed and not only shown.
    [[nodiscard]] bool isPlugged() const noexcept { return _output != nullptr; }

private:
    /// @return Whether the system knows.
    [[nodiscard]] bool send(KeyChange change) noexcept;
    [[nodiscard]] bool trySend(KeyChange change) noexcept;
    void tellProblem(const char *problem) noexcept;

    const KeyboardMaker _maker;
    DaemonListener &_listener;
    const DaemonLog _log;
    HeldKeys _held;
    bool _isAsleep = false;
    std::string _toldProblem;                  ///< why there is no keyboard, as it was told last
    std::unique_ptr<Linux::KeyOutput> _output; ///< null: none was wanted, or it failed and so did the next
};

} // namespace ZorvaTouch::Tools
