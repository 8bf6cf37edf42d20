#pragma once

#include "Host/Objects/EventSystem.h"
#include "Plugin/BoundaryObject.h"

#include <memory>

namespace ZorvaTouch::Host {

/// A client of the event system as the other side sees it: a handle of what the system keeps about it.
///
/// Threads: any.
class EventClient final : public BoundaryObject<EventClient, ZorvaEventClient> {
public:
    EventClient(std::shared_ptr<EventSystem> system, EventSystem::ClientId id) noexcept;

    [[nodiscard]] EventSystem::ClientId id() const noexcept { return _id; }

    /// What its source performs; the context is the client.
    static void serve(void *client) noexcept;

private:
    friend class BoundaryObject<EventClient, ZorvaEventClient>;
    struct Entries;
    static const ZorvaEventClientTable kTable;

    ~EventClient();

    const std::shared_ptr<EventSystem> _system;
    const EventSystem::ClientId _id;
};

} // namespace ZorvaTouch::Host
