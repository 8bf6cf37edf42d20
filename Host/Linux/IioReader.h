#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Linux/AccelIdentity.h"
#include "Host/Linux/IioSession.h"
#include "Host/Linux/IioWakeup.h"
#include "Host/Objects/Accelerometer.h"
#include "Shared/Ports/Clock.h"
#include "Shared/Ports/Log.h"
#include "Shared/Util/Ticks.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

namespace ZorvaTouch::Linux {

/// What goes on on the thread of an accelerometer: it sleeps until somebody listens, then opens the sensor
/// and delivers its samples. All that is slow, such as powering the sensor up, happens there.
///
/// One that fails is tried again when the accelerometer gets its first listener or is told an interval, that
/// is, at the next schedule of anybody. A failure is one line of the log, however often it repeats while
/// somebody listens.
///
/// Threads: `run` on its own; the rest on any.
class IioReader final : public Host::AccelerometerObserver {
public:
    /// @throws std::system_error, std::bad_alloc
    IioReader(AccelIdentity identity, IioOpener opener, std::shared_ptr<Ports::Log> log);

    void onReportInterval(double microseconds) noexcept override;
    void onListening(bool isListenedTo) noexcept override;

    /// The thread's body: returns when it was told to end, with the sensor off.
    /// @param accelerometer  What samples are delivered to. Borrowed for the call.
    void run(Host::Accelerometer &accelerometer) noexcept;
    void end() noexcept;
    /// Whether `run` has returned, or is about to and does nothing more.
    [[nodiscard]] bool hasEnded() const noexcept { return _hasEnded.load(std::memory_order_acquire); }

private:
    struct Wish {
        bool isListenedTo = false;
        bool isEnding = false;
        std::optional<double> intervalUs;
        std::uint64_t attempt = 0; ///< changes when a sensor that failed is to be tried again
        std::uint64_t period = 0;  ///< changes as the first listener comes and the last one goes
    };

    [[nodiscard]] Wish wish() const noexcept;
    void follow(const Wish &wish) noexcept;
    void start(const Wish &wish) noexcept;
    void setInterval(double intervalUs) noexcept;
    void wait(Host::Accelerometer &accelerometer) noexcept;
    void receive(Host::Accelerometer &accelerometer, bool isBroken) noexcept;
    void deliver(Host::Accelerometer &accelerometer, const AccelSample &sample) noexcept;
    void lose(const SystemFailure &reason) noexcept;
    void tellFrequency() noexcept;
    void tellFailure(const char *reason) noexcept;

    const AccelIdentity _identity;
    const IioSysfs _device;
    const IioOpener _opener;
    const std::shared_ptr<Ports::Log> _log;
    Ports::Clock &_clock;
    const Util::TickConverter _ticks;
    const IioWakeup _wakeup;

    mutable Host::Mutex _lock;
    Wish _wish ZORVA_GUARDED_BY(_lock);

    std::atomic<bool> _hasEnded{false};

    // The thread's own.
    std::optional<IioSession> _session;
    std::optional<double> _intervalUs; ///< that the session was asked for
    std::uint64_t _attempt = 0;        ///< the last that was made
    std::uint64_t _period = 0;
    std::string _toldFailure; ///< in this period
};

} // namespace ZorvaTouch::Linux
