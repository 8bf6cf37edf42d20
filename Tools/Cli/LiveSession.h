#pragma once

#include "Host/Objects/Accelerometer.h"
#include "Host/Objects/EventSystem.h"
#include "Host/Objects/Service.h"
#include "Host/Runtime/SerialQueue.h"
#include "Host/Simulated/Device.h"
#include "Host/Simulated/VirtualClock.h"
#include "Tools/Cli/DeferredLogs.h"
#include "Tools/Cli/Environment.h"
#include "Tools/Cli/EventInbox.h"
#include "Tools/Cli/LiveSource.h"
#include "Tools/Hosting/HostedService.h"
#include "Tools/Hosting/SessionPlatform.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {

/// Hears what a session plays, on the thread that plays.
class LiveListener {
public:
    virtual ~LiveListener() = default;

    /// An event of the service.
    /// @param timeNs  Since the session began to play.
    virtual void heard(const HostEvent &event, std::uint64_t timeNs) = 0;
    /// It is later now: events up to about this time have been heard. Comes some 25 times a second.
    /// @param image  The device's latest, if there was one.
    virtual void passed(std::uint64_t timeNs, const std::optional<InputReport::Image> &image) = 0;
    /// Lines of the log are going to standard error, which may be the same screen.
    virtual void makeRoomForLog() = 0;
};

/// How a session goes.
struct LiveOptions {
    std::string plugIn; ///< the file
    float speed = 1;    ///< infinity: in virtual time, as fast as it goes
    Ports::LogLevel logLevel = Ports::LogLevel::Error;
};

/// A host for one plug-in: a service with a simulated device and an accelerometer, and a queue for its
/// events.
///
///     EventInbox inbox;
///     LiveSession session(options, inbox, environment);
///     session.start(source.startNs);
///     session.play(std::move(source), listener);
///     use(session.service());
///
/// Threads: one. Who wants an end on another thread stops the inbox.
class LiveSession {
public:
    /// Loads the plug-in and makes its service, no more.
    /// @param inbox  Of this session alone. Borrowed.
    /// @throws CliError
    LiveSession(const LiveOptions &options, EventInbox &inbox, Environment &environment);
    /// Ends everything and unloads the plug-in.
    ~LiveSession();
    LiveSession(const LiveSession &) = delete;
    LiveSession &operator=(const LiveSession &) = delete;

    /// Offers the device, and opens it.
    /// @param startNs  When virtual time begins.
    void start(std::uint64_t startNs);

    /// Schedules the service, plays to the end or until the inbox is stopped, unschedules, and hears the
    /// rest. Once.
    void play(LiveSource source, LiveListener &listener);

    [[nodiscard]] HostedService &service() noexcept { return *_service; }
    [[nodiscard]] Simulated::DeviceCounters deviceCounters() const { return _device->counters(); }
    /// A time of the host's clock, since the session began to play.
    [[nodiscard]] std::uint64_t sinceStart(std::uint64_t timeNs) const noexcept;

private:
    [[nodiscard]] bool isVirtual() const noexcept;
    [[nodiscard]] Simulated::PlayerOutput playerOutput();
    void playInLockStep(LiveSource source, LiveListener &listener);
    void playAtPace(LiveSource source, LiveListener &listener);
    void setState(const Frame &frame);
    void hear(LiveListener &listener);
    [[nodiscard]] std::unique_ptr<Ports::LogProvider> openLogs(Environment &environment);
    [[nodiscard]] std::uint64_t nowNs() noexcept;
    void end() noexcept;

    const LiveOptions _options;
    Simulated::VirtualClock _virtualClock;
    DeferredLogs *_deferredLogs = nullptr; ///< the platform's, when standard output is a screen
    SessionPlatform _platform;
    EventInbox &_inbox;
    std::shared_ptr<Host::EventSystem> _events;
    Ref<Host::Accelerometer> _accelerometer;
    Ref<Simulated::Device> _device;
    Ref<Host::Service> _offered;
    Host::SerialQueue _queue;
    std::optional<HostedService> _service; ///< loaded last, unloaded first
    std::uint64_t _startNs = 0;
};

} // namespace ZorvaTouch::Tools
