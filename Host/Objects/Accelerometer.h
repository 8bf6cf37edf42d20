#pragma once

#include "Host/Objects/EventSystem.h"
#include "Host/Objects/Properties.h"
#include "Plugin/BoundaryObject.h"
#include "Shared/HostEvent.h"

#include <cstdint>
#include <memory>
#include <optional>

namespace ZorvaTouch::Host {

/// An accelerometer among the services of the host's event system: "PrimaryUsagePage" 0xFF00,
/// "PrimaryUsage" 3. It takes the property "ReportInterval", a double in microseconds, and no other; it sends
/// what it is told to whatever the interval.
///
/// Threads: any, several at a time.
class Accelerometer final : public BoundaryObject<Accelerometer, ZorvaService> {
public:
    /// An accelerometer of that event system, which keeps it.
    /// @throws std::bad_alloc, std::system_error
    [[nodiscard]] static Ref<Accelerometer> create(const std::shared_ptr<EventSystem> &system);

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

    /// What was asked for, in microseconds, if anything was.
    [[nodiscard]] std::optional<double> reportInterval() const;
    [[nodiscard]] Properties &properties() noexcept { return _properties; }
    [[nodiscard]] const Properties &properties() const noexcept { return _properties; }

private:
    friend class BoundaryObject<Accelerometer, ZorvaService>;
    struct Entries;
    static const ZorvaServiceTable kTable;

    explicit Accelerometer(const std::shared_ptr<EventSystem> &system);
    ~Accelerometer() = default;

    Properties _properties;
    const std::weak_ptr<EventSystem> _system;
};

} // namespace ZorvaTouch::Host
