#pragma once

#include "Host/Interface/Platform.h"
#include "Host/Linux/AccelIdentity.h"
#include "Host/Linux/IioNode.h"
#include "Host/Objects/Accelerometer.h"
#include "Shared/Ports/Log.h"

#include <memory>

namespace ZorvaTouch::Linux {

class IioReader;

/// An accelerometer of the kernel's among the services of an event system, for as long as this lives. The
/// sensor is on while a client listens, and samples as often as "ReportInterval" says, as far as it can. A
/// sample's time stamp is the sensor's, or when it was read if it has none.
///
/// It is read on a thread of its own, "zorva-accel", that sleeps until there is something to do. The device's
/// end is not always heard there: destroying this is how it is told. What fails is a line of the log, and
/// tried again at the next schedule of a client.
///
/// Threads: one at a time.
class IioAccelerometer {
public:
    /// @param opener  Opens its node.
    /// @throws std::system_error, std::bad_alloc
    IioAccelerometer(const std::shared_ptr<Host::EventSystem> &system, const AccelIdentity &identity,
                     IioOpener opener, std::shared_ptr<Ports::Log> log);
    /// Takes it out of the system, and waits until the sensor is off.
    ~IioAccelerometer();
    IioAccelerometer(const IioAccelerometer &) = delete;
    IioAccelerometer &operator=(const IioAccelerometer &) = delete;

    /// Takes it out of the system and does not wait: a sensor that does not answer can keep its thread for
    /// many seconds.
    void leave() noexcept;
    /// Whether it has been taken out and the sensor is off, so that the end does not wait.
    [[nodiscard]] bool hasLeft() const noexcept;

private:
    const std::shared_ptr<IioReader> _reader;
    const Ref<Host::Accelerometer> _accelerometer;
    std::unique_ptr<Host::Thread> _thread;
};

} // namespace ZorvaTouch::Linux
