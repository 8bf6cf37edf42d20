#pragma once

#include "Host/Linux/HidrawDevice.h"
#include "Host/Linux/MainLoop.h"
#include "Host/Objects/EventSystem.h"
#include "Host/Runtime/SerialQueue.h"
#include "Tools/Daemon/RecordingSaver.h"
#include "Tools/Daemon/SurfaceKeys.h"
#include "Tools/Hosting/HostedService.h"

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>

namespace ZorvaTouch::Tools {

/// Makes a surface's device, closed; it tells the observer what happens to it.
using DeviceMaker = std::function<Ref<ZorvaDevice>(std::shared_ptr<Linux::HidrawObserver>)>;

/// What all surfaces share. Borrowed but for the plug-in and the event system.
struct SurfaceSurroundings {
    std::shared_ptr<const Host::PlugInFile> plugIn;
    std::shared_ptr<Host::EventSystem> events; ///< of surfaces without an accelerometer of their own
    Host::SerialQueue &keyQueue;
    Keyboard &keyboard; ///< of surfaces that the system reports
    KeyMap keyMap;
    KeyLimit keyLimit = {};
    DaemonListener &listener;
    Linux::MainLoop &loop;
    DaemonLog log;
    Linux::LoopTimer after = {}; ///< empty: the loop's own
    bool savesSerial = false;    ///< recordings have the surface's serial number

    [[nodiscard]] Linux::LoopWatch later(std::chrono::milliseconds delay, std::function<void()> function) {
        return after ? after(delay, std::move(function)) : loop.after(delay, std::move(function));
    }
};

/// A surface cannot be opened since another program uses it; `what()` is the reason in one line.
class SurfaceInUse : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// A surface that works: its device, the plug-in's service on it, and what its gestures do to the keyboard.
///
/// However it ends, on its own account or because it is destroyed, its keys go up: at once when the device is
/// gone or the plug-in's input thread ends, without waiting for the main thread. A device that sends nothing
/// more in the middle of a hold would leave its key down for ever: after most of a second the key goes up.
///
/// Threads: the main thread.
class Surface {
public:
    /// Between two reports of a device that works there are 10 ms.
    static constexpr std::chrono::milliseconds kLongestSilence{900};

    /// Opens the device and begins to listen.
    /// @param keyboard  Receives its keys. Borrowed.
    /// @param events  Where its accelerometer is.
    /// @param onLost  Called on the main thread, once at most, when the surface no longer works, with the
    ///                reason; not from within this object's functions.
    /// @throws SurfaceInUse
    /// @throws std::runtime_error  It cannot be opened, with the reason in one line.
    /// @throws std::bad_alloc
    Surface(SurfaceSurroundings &surroundings, const SurfaceName &name, const DeviceMaker &maker,
            Keyboard &keyboard, const std::shared_ptr<Host::EventSystem> &events,
            std::function<void(const std::string &reason)> onLost);
    /// Closes the device, with everything that came before carried out and every key up.
    ~Surface();
    Surface(const Surface &) = delete;
    Surface &operator=(const Surface &) = delete;

    /// Begins to listen anew: with the accelerometer that is there now.
    /// @throws std::runtime_error  It does not listen any more, with the reason in one line.
    void reschedule();
    /// Listens no more: for good, with every key up. What it has recorded stays.
    void stop();
    /// Lets go of its keys, and returns when they are up. The touch that goes on does no more.
    void suspend();

    /// Whether no touch goes on that may still do something.
    [[nodiscard]] bool isIdle() const noexcept { return _keys->isIdle(); }
    /// The recording so far; nothing if the service has none.
    /// @throws std::bad_alloc
    [[nodiscard]] std::optional<SurfaceRecording> recording() const;

private:
    class Observer;

    void schedule();
    void watchSilence();
    void checkSilence();
    void unschedule(SurfaceEnd end);
    void letGo(SurfaceEnd end);

    SurfaceSurroundings &_surroundings;
    const SurfaceName _name;
    Keyboard &_keyboard;
    const std::shared_ptr<Observer> _observer;
    std::shared_ptr<SurfaceKeys> _keys; ///< of the last schedule
    std::optional<HostedService> _service;
    std::uint64_t _reportsHeard = 0; ///< when silence was looked for last
    Linux::LoopWatch _silence;       ///< while a key is held
};

} // namespace ZorvaTouch::Tools
