#pragma once

#include "Host/Interface/RunLoop.h"
#include "Plugin/Ref.h"
#include "Service/ServiceLog.h"
#include "Shared/HostEvent.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace ZorvaTouch {

/// A subscription to the host's accelerometer, as long as the object lives.
///
/// Threads: the input-report thread's.
class AccelSystem {
public:
    using EventHandler = std::function<void(const HostEvent &event)>;

    /// Subscribes. Without a run loop, a mode or a handler the object exists and does nothing.
    ///
    /// @param eventSystem   Where clients of the host's event system come from; may be null.
    /// @param log           For what an event fails with. Borrowed for the life of the object.
    /// @param runLoop       Events arrive on its thread, in `mode`. Borrowed likewise.
    /// @param rateHz        Samples a second that the accelerometer is asked for; at least 1. That it refuses
    ///                      does not matter.
    /// @param eventHandler  Gets the events of the accelerometer type.
    /// @throws std::runtime_error  The host has no event system or no accelerometer.
    AccelSystem(const Ref<ZorvaService> &eventSystem, const ServiceLog &log, Host::RunLoop *runLoop,
                const char *mode, std::uint32_t rateHz, EventHandler eventHandler);
    ~AccelSystem() { cleanup(); }
    AccelSystem(const AccelSystem &) = delete;
    AccelSystem &operator=(const AccelSystem &) = delete;

    /// Stops delivery. May be called again.
    void cleanup() noexcept;

private:
    void createClient(const Ref<ZorvaService> &eventSystem);
    void setMatching();
    void takeFirstService();
    void setReportInterval(std::uint32_t rateHz);
    static void handleEvent(void *context, const ZorvaEvent *event) noexcept;

    const ServiceLog &_log;
    EventHandler _eventHandler;
    Ref<ZorvaEventClient> _client;
    Ref<ZorvaService> _service;
    Host::RunLoop *_runLoop = nullptr; ///< null until events arrive, and once cleaned up
    std::string _mode;
};

} // namespace ZorvaTouch
