#pragma once

#include "Host/Interface/Mutex.h"
#include "Host/Objects/Inbox.h"
#include "Plugin/Ref.h"
#include "Shared/HostEvent.h"
#include "Shared/Util/PropertyValue.h"

#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <span>
#include <vector>

namespace ZorvaTouch::Host {

class Accelerometer;
class EventClient;

/// What has happened in an event system so far. An event counts once for each client.
struct EventCounters {
    std::uint64_t heard = 0;   ///< events that a client's callbacks have returned from
    std::uint64_t dropped = 0; ///< events that a client was to hear and never did
    std::uint32_t clients = 0; ///< that there are now
};

/// The host's event system: its services, and the clients that listen to them.
///
/// A client has one source on its run loop, as long as it is scheduled and a plugged service matches it. It
/// serves one event in each pass. A scheduled client keeps itself until it is unscheduled.
///
/// Threads: any, several at a time. No lock is held while a callback runs.
class EventSystem : public std::enable_shared_from_this<EventSystem> {
public:
    /// Events that can wait for one client; the newest beyond are dropped.
    static constexpr std::size_t kQueueCapacity = 63;

    /// @throws std::bad_alloc, std::system_error
    [[nodiscard]] static std::shared_ptr<EventSystem> create();
    ~EventSystem();
    EventSystem(const EventSystem &) = delete;
    EventSystem &operator=(const EventSystem &) = delete;

    /// A client that is told to match every service until it says otherwise. It keeps the system.
    /// @throws std::bad_alloc
    [[nodiscard]] Ref<ZorvaEventClient> createClient();

    /// Waits until every event delivered before has been heard or dropped by every client. Does not wait for
    /// clients without a source, nor for one whose loop runs on the calling thread.
    void waitUntilHandled();

    [[nodiscard]] EventCounters counters() const;

private:
    friend class Accelerometer;
    friend class EventClient;

    using ClientId = std::uint64_t;
    struct Listener {
        ZorvaEventClientCallback function;
        void *context;
        std::uint64_t number; ///< no two are equal
    };
    struct Client {
        std::optional<PropertyValue> matching; ///< every service if there is none
        std::vector<Listener> listeners;
        Inbox<Ref<const ZorvaEvent>> inbox{kQueueCapacity};
        Ref<ZorvaEventClient> scheduled; ///< itself, while it has a place on a loop
    };
    struct Service {
        Ref<Accelerometer> accelerometer;
        bool isPlugged = true;
        bool isToldListened = false; ///< what its observer knows: whether somebody listens
        bool isTelling = false;      ///< a thread is at that; it sees to what changes meanwhile
    };

    EventSystem();

    // For services.
    void add(const Ref<Accelerometer> &accelerometer);
    void remove(const Accelerometer &accelerometer);
    void setPlugged(const Accelerometer &accelerometer, bool isPlugged);
    void publish(const Accelerometer &from, const Ref<const ZorvaEvent> &event);

    // For clients.
    void setMatching(ClientId id, PropertyValue properties);
    std::size_t copyServices(ClientId id, std::span<ZorvaService *> services);
    void listen(ClientId id, ZorvaEventClientCallback function, void *context);
    void stopListening(ClientId id, ZorvaEventClientCallback function, void *context) noexcept;
    void schedule(EventClient &handle, ZorvaRunLoop *loop, const char *mode);
    void unschedule(ClientId id, const ZorvaRunLoop *loop, const char *mode) noexcept;
    void leaveLoop(ClientId id) noexcept;
    void serve(ClientId id);
    void remove(ClientId id) noexcept;

    [[nodiscard]] ClientId addClient();
    [[nodiscard]] static bool isMatch(const Client &client, const Service &service);
    [[nodiscard]] bool hasMatch(const Client &client) const ZORVA_REQUIRES(_lock);
    [[nodiscard]] Service *find(const Accelerometer &accelerometer) ZORVA_REQUIRES(_lock);
    [[nodiscard]] bool isListenedTo(const Service &service) const ZORVA_REQUIRES(_lock);
    [[nodiscard]] Service *nextToTell() ZORVA_REQUIRES(_lock);
    [[nodiscard]] bool tellOne() noexcept;
    void tellListening() noexcept;
    void updateSource(Client &client) ZORVA_REQUIRES(_lock);
    void updateSources() ZORVA_REQUIRES(_lock);
    [[nodiscard]] bool mustWaitFor(const std::map<ClientId, std::uint64_t> &delivered) const
        ZORVA_REQUIRES(_lock);
    [[nodiscard]] std::optional<Ref<const ZorvaEvent>> takeEvent(ClientId id,
                                                                 std::vector<Listener> &listeners);
    [[nodiscard]] bool isListening(ClientId id, std::uint64_t number) const;
    void finishEvent(ClientId id, bool wasHeard);

    mutable Mutex _lock;
    std::condition_variable_any _settled; ///< events were settled, or a source went
    std::vector<Service> _services ZORVA_GUARDED_BY(_lock);
    std::map<ClientId, Client> _clients ZORVA_GUARDED_BY(_lock);
    std::uint64_t _lastNumber ZORVA_GUARDED_BY(_lock) = 0;
    EventCounters _counters ZORVA_GUARDED_BY(_lock); ///< but for the clients
};

} // namespace ZorvaTouch::Host
