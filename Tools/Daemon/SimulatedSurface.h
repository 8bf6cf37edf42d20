#pragma once

#include "Host/Linux/MainLoop.h"
#include "Host/Objects/Accelerometer.h"
#include "Host/Simulated/Device.h"
#include "Host/Simulated/Player.h"
#include "Tools/Daemon/Surface.h"
#include "Tools/Hosting/FingerSource.h"

#include <functional>
#include <memory>

namespace ZorvaTouch::Tools {

/// A surface that is not there, and somebody who touches it.
///
/// Threads: the main thread.
class SimulatedSurface {
public:
    /// @param hasAccelerometer  The finger shakes an accelerometer of the surface's own.
    /// @param loop              Borrowed.
    /// @param onFinished        Called on the main thread when all has been played and handled.
    SimulatedSurface(const SimulatedFinger &finger, bool hasAccelerometer, Linux::MainLoop &loop,
                     std::function<void()> onFinished);
    ~SimulatedSurface();
    SimulatedSurface(const SimulatedSurface &) = delete;
    SimulatedSurface &operator=(const SimulatedSurface &) = delete;

    [[nodiscard]] SurfaceName name() const;
    [[nodiscard]] DeviceMaker maker() const;
    /// Where its accelerometer is, and no other: one system for all surfaces would bring every sample to
    /// every surface. Null without an accelerometer.
    [[nodiscard]] std::shared_ptr<Host::EventSystem> events() const noexcept { return _events; }

    /// Begins to play, at the pace of life. Once, when the device is open.
    /// @throws std::system_error
    void play();

private:
    /// Receives the device's reports, which the device itself does not report.
    class Observers;

    [[nodiscard]] Simulated::FrameSource frames();

    const SimulatedFinger _finger;
    Linux::MainLoop &_loop;
    const std::function<void()> _onFinished;
    const std::shared_ptr<Host::EventSystem> _events;
    const Ref<Simulated::Device> _device;
    const std::shared_ptr<bool> _isThere; ///< for what is posted and comes too late
    const std::shared_ptr<Observers> _observers;
    Simulated::Player _player;
};

} // namespace ZorvaTouch::Tools
