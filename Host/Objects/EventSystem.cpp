#include "Host/Objects/EventSystem.h"

#include "Host/Objects/Accelerometer.h"
#include "Host/Objects/EventClient.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Host {

std::shared_ptr<EventSystem> EventSystem::create() { return std::shared_ptr<EventSystem>(new EventSystem); }

EventSystem::EventSystem() = default;
EventSystem::~EventSystem() = default;

// --- Services ----------------------------------------------------------------------------------------------

void EventSystem::add(const Ref<Accelerometer> &accelerometer) {
    {
        MutexLock lock(_lock);
        _services.push_back({.accelerometer = accelerometer});
        updateSources();
    }
    tellListening();
}

void EventSystem::remove(const Accelerometer &accelerometer) {
    Ref<Accelerometer> removed; // released without the lock
    MutexLock lock(_lock);
    Service *const service = find(accelerometer);
    if (!service)
        return;
    removed = service->accelerometer;
    _services.erase(_services.begin() + (service - _services.data()));
    updateSources();
}

void EventSystem::setPlugged(const Accelerometer &accelerometer, bool isPlugged) {
    {
        MutexLock lock(_lock);
        if (Service *const service = find(accelerometer))
            service->isPlugged = isPlugged;
        updateSources();
    }
    tellListening();
}

EventSystem::Service *EventSystem::find(const Accelerometer &accelerometer) {
    const auto service = std::find_if(_services.begin(), _services.end(), [&](const Service &candidate) {
        return candidate.accelerometer.get() == &accelerometer;
    });
    return service == _services.end() ? nullptr : &*service;
}

bool EventSystem::isMatch(const Client &client, const Service &service) {
    return service.isPlugged &&
           (!client.matching || service.accelerometer->properties().match(*client.matching));
}

bool EventSystem::hasMatch(const Client &client) const {
    return std::any_of(_services.begin(), _services.end(),
                       [&](const Service &service) { return isMatch(client, service); });
}

void EventSystem::updateSource(Client &client) {
    if (hasMatch(client))
        return client.inbox.connect();
    client.inbox.disconnect();
    _counters.dropped += client.inbox.discard();
    _settled.notify_all();
}

void EventSystem::updateSources() {
    for (auto &[id, client] : _clients)
        updateSource(client);
}

// --- Who listens -------------------------------------------------------------------------------------------

bool EventSystem::isListenedTo(const Service &service) const {
    return std::any_of(_clients.begin(), _clients.end(), [&](const auto &entry) {
        return entry.second.inbox.isConnected() && isMatch(entry.second, service);
    });
}

EventSystem::Service *EventSystem::nextToTell() {
    for (Service &service : _services)
        if (!service.isTelling && service.isToldListened != isListenedTo(service))
            return &service;
    return nullptr;
}

bool EventSystem::tellOne() noexcept {
    Ref<Accelerometer> accelerometer;
    bool isListened;
    {
        MutexLock lock(_lock);
        Service *const service = nextToTell();
        if (!service)
            return false;
        service->isTelling = true;
        isListened = service->isToldListened = !service->isToldListened;
        accelerometer = service->accelerometer;
    }
    accelerometer->tellListening(isListened);
    MutexLock lock(_lock);
    if (Service *const service = find(*accelerometer.get()))
        service->isTelling = false;
    return true;
}

void EventSystem::tellListening() noexcept {
    while (tellOne())
        ;
}

// --- Events ------------------------------------------------------------------------------------------------

void EventSystem::publish(const Accelerometer &from, const Ref<const ZorvaEvent> &event) {
    MutexLock lock(_lock);
    const Service *const service = find(from);
    if (!service)
        return;
    for (auto &[id, client] : _clients)
        if (client.inbox.isConnected() && isMatch(client, *service) && !client.inbox.push(event))
            ++_counters.dropped;
}

void EventSystem::waitUntilHandled() {
    MutexLock lock(_lock);
    std::map<ClientId, std::uint64_t> delivered;
    for (const auto &[id, client] : _clients)
        delivered[id] = client.inbox.accepted();
    while (mustWaitFor(delivered))
        _settled.wait(_lock);
}

bool EventSystem::mustWaitFor(const std::map<ClientId, std::uint64_t> &delivered) const {
    return std::any_of(delivered.begin(), delivered.end(), [&](const auto &entry) {
        _lock.assertHeld(); // by whoever calls this
        const auto client = _clients.find(entry.first);
        return client != _clients.end() && client->second.inbox.mustWaitFor(entry.second);
    });
}

void EventSystem::serve(ClientId id) {
    std::vector<Listener> listeners;
    const std::optional<Ref<const ZorvaEvent>> event = takeEvent(id, listeners);
    if (!event)
        return;
    bool wasHeard = false;
    for (const Listener &listener : listeners)
        if (isListening(id, listener.number)) { // one of the others may have taken it away
            listener.function(listener.context, event->get());
            wasHeard = true;
        }
    finishEvent(id, wasHeard);
}

std::optional<Ref<const ZorvaEvent>> EventSystem::takeEvent(ClientId id, std::vector<Listener> &listeners) {
    MutexLock lock(_lock);
    Client &client = _clients.at(id);
    listeners = client.listeners;
    return client.inbox.take();
}

bool EventSystem::isListening(ClientId id, std::uint64_t number) const {
    MutexLock lock(_lock);
    const std::vector<Listener> &listeners = _clients.at(id).listeners;
    return std::any_of(listeners.begin(), listeners.end(),
                       [&](const Listener &listener) { return listener.number == number; });
}

void EventSystem::finishEvent(ClientId id, bool wasHeard) {
    MutexLock lock(_lock);
    ++(wasHeard ? _counters.heard : _counters.dropped);
    _clients.at(id).inbox.finish();
    _settled.notify_all();
}

// --- Clients -----------------------------------------------------------------------------------------------

Ref<ZorvaEventClient> EventSystem::createClient() {
    const ClientId id = addClient();
    try {
        return Ref<ZorvaEventClient>::adopt(new EventClient(shared_from_this(), id));
    } catch (...) {
        remove(id);
        throw;
    }
}

EventSystem::ClientId EventSystem::addClient() {
    MutexLock lock(_lock);
    const ClientId id = ++_lastNumber;
    _clients.try_emplace(id);
    return id;
}

void EventSystem::remove(ClientId id) noexcept {
    MutexLock lock(_lock);
    _clients.erase(id);
}

void EventSystem::setMatching(ClientId id, PropertyValue properties) {
    {
        MutexLock lock(_lock);
        Client &client = _clients.at(id);
        client.matching = std::move(properties);
        updateSource(client);
    }
    tellListening();
}

std::size_t EventSystem::copyServices(ClientId id, std::span<ZorvaService *> services) {
    MutexLock lock(_lock);
    std::size_t count = 0;
    for (const Service &service : _services)
        if (isMatch(_clients.at(id), service)) {
            if (count < services.size())
                services[count] = Ref<ZorvaService>::retain(service.accelerometer.get()).release();
            ++count;
        }
    return count;
}

void EventSystem::listen(ClientId id, ZorvaEventClientCallback function, void *context) {
    MutexLock lock(_lock);
    if (function)
        _clients.at(id).listeners.push_back({function, context, ++_lastNumber});
}

void EventSystem::stopListening(ClientId id, ZorvaEventClientCallback function, void *context) noexcept {
    MutexLock lock(_lock);
    std::erase_if(_clients.find(id)->second.listeners, [&](const Listener &listener) {
        return listener.function == function && listener.context == context;
    });
}

void EventSystem::schedule(EventClient &handle, ZorvaRunLoop *loop, const char *mode) {
    leaveLoop(handle.id());
    {
        MutexLock lock(_lock);
        Client &client = _clients.at(handle.id());
        client.inbox.schedule(loop, mode, EventClient::serve, &handle);
        client.scheduled = handle.ref();
        updateSource(client);
    }
    tellListening();
}

void EventSystem::unschedule(ClientId id, const ZorvaRunLoop *loop, const char *mode) noexcept {
    const std::shared_ptr<EventSystem> self =
        weak_from_this().lock(); // the client may go, and be its last owner
    bool isPlace;
    {
        MutexLock lock(_lock);
        isPlace = _clients.find(id)->second.inbox.isScheduledOn(loop, mode);
    }
    if (!isPlace)
        return;
    leaveLoop(id);
    tellListening();
}

void EventSystem::leaveLoop(ClientId id) noexcept {
    // Released in the opposite order, after the lock: the loop, then perhaps the client itself.
    Ref<ZorvaEventClient> self;
    Ref<ZorvaRunLoop> loop;
    MutexLock lock(_lock);
    Client &client = _clients.find(id)->second;
    loop = client.inbox.unschedule();
    self = std::move(client.scheduled);
    _counters.dropped += client.inbox.discard();
    _settled.notify_all();
}

EventCounters EventSystem::counters() const {
    MutexLock lock(_lock);
    EventCounters counters = _counters;
    counters.clients = static_cast<std::uint32_t>(_clients.size());
    return counters;
}

} // namespace ZorvaTouch::Host
