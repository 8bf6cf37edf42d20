#pragma once

#include "Host/Objects/EventSystem.h"
#include "Host/Objects/Properties.h"
#include "Plugin/BoundaryObject.h"
#include "Shared/HostEvent.h"

#include <cstdint>
#include <memory>
#include <optional>

namespace ZorvaTouch::Host {

/// Hears how an accelerometer is used, so that a sensor behind it works only while somebody listens.
///
/// Threads: whichever uses it. No lock is held; it may call the accelerometer back.
class AccelerometerObserver {
public:
    virtual ~AccelerometerObserver() = default;
    /// "ReportInterval" was set, perhaps to what it was. Any number that a double can be.
    virtual void onReportInterval(double microseconds) noexcept = 0;
    /// The first client listens, that is, it is scheduled and matches; or the last one has ceased to. Told in
    /// order and one at a time, so perhaps on the thread of a client that changed something meanwhile; what
    /// did not last is left out.
    virtual void onListening(bool isListenedTo) noexcept = 0;
};

/// An accelerometer among the services of the host's event system: "PrimaryUsagePage" 0xFF00,
/// "PrimaryUsage" 3. It takes the property "ReportInterval", a double in microseconds, and no other; it sends
/// what it is told to whatever the interval.
///
/// Threads: any, several at a time.
class Accelerometer final : public BoundaryObject<Accelerometer, ZorvaService> {
public:
    /// An accelerometer of that event system, which keeps it.
    /// @param observer  Not kept: once it is gone nothing is told.
    /// @throws std::bad_alloc, std::system_error
    [[nodiscard]] static Ref<Accelerometer> create(const std::shared_ptr<EventSystem> &system,
                                                   std::weak_ptr<AccelerometerObserver> observer = {});

    /// Sends a sample to every client that is scheduled and matches.
    /// @param x, y, z    g.
    /// @param timestamp  Host ticks.
    /// @throws std::bad_alloc
    void deliver(float x, float y, float z, std::uint64_t timestamp);
    /// Sends any event, also such as no accelerometer sends. The event no longer changes.
    void deliver(std::shared_ptr<const HostEvent> event);

    /// Waits until every event delivered before has been heard or dropped; see EventSystem.
    void waitUntilHandled();

    /// It disappears: no client finds it, and sources of clients go that match no other service.
    void unplug();
    void plug();

    /// Takes it out of the system for good: as unplugged, and the system no longer keeps it. Its observer
    /// hears no more of who listens; a call that is on its way may still come to its end.
    void withdraw();

    /// What was asked for, in microseconds, if anything was.
    [[nodiscard]] std::optional<double> reportInterval() const;
    [[nodiscard]] Properties &properties() noexcept { return _properties; }
    [[nodiscard]] const Properties &properties() const noexcept { return _properties; }

private:
    friend class BoundaryObject<Accelerometer, ZorvaService>;
    struct Entries;
    static const ZorvaServiceTable kTable;

    Accelerometer(const std::shared_ptr<EventSystem> &system, std::weak_ptr<AccelerometerObserver> observer);
    ~Accelerometer() = default;

    ZorvaBoolean setProperty(const char *key, const ZorvaValue *value);

    friend class EventSystem;
    void tellListening(bool isListenedTo) const noexcept;

    Properties _properties;
    const std::weak_ptr<EventSystem> _system;
    const std::weak_ptr<AccelerometerObserver> _observer;
};

} // namespace ZorvaTouch::Host
