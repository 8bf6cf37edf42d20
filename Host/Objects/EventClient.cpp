#include "Host/Objects/EventClient.h"

#include "Plugin/Guarded.h"
#include "Plugin/ValueObject.h"

#include <utility>

namespace ZorvaTouch::Host {

struct EventClient::Entries {
    /// Runs what returns nothing and is given up without memory.
    template <typename Body> static void run(const Body &body) noexcept {
        guarded(false, [&] {
            body();
            return true;
        });
    }

    static void setMatching(ZorvaEventClient *client, const ZorvaValue *properties) noexcept {
        run([&] { of(client)._system->setMatching(of(client)._id, readValue(properties)); });
    }
    static std::size_t copyServices(ZorvaEventClient *client, ZorvaService **services,
                                    std::size_t capacity) noexcept {
        return guarded<std::size_t>(0, [&] {
            return of(client)._system->copyServices(of(client)._id, {services, services ? capacity : 0});
        });
    }
    static void registerCallback(ZorvaEventClient *client, ZorvaEventClientCallback callback,
                                 void *context) noexcept {
        run([&] { of(client)._system->listen(of(client)._id, callback, context); });
    }
    static void unregisterCallback(ZorvaEventClient *client, ZorvaEventClientCallback callback,
                                   void *context) noexcept {
        of(client)._system->stopListening(of(client)._id, callback, context);
    }
    static void schedule(ZorvaEventClient *client, ZorvaRunLoop *loop, const char *mode) noexcept {
        run([&] { of(client)._system->schedule(of(client), loop, mode); });
    }
    static void unschedule(ZorvaEventClient *client, ZorvaRunLoop *loop, const char *mode) noexcept {
        of(client)._system->unschedule(of(client)._id, loop, mode);
    }
};

const ZorvaEventClientTable EventClient::kTable{
    .size = sizeof(ZorvaEventClientTable),
    .retain = EventClient::retain<ZorvaEventClient>,
    .release = EventClient::release<ZorvaEventClient>,
    .setMatching = Entries::setMatching,
    .copyServices = Entries::copyServices,
    .registerCallback = Entries::registerCallback,
    .unregisterCallback = Entries::unregisterCallback,
    .schedule = Entries::schedule,
    .unschedule = Entries::unschedule,
};

EventClient::EventClient(std::shared_ptr<EventSystem> system, EventSystem::ClientId id) noexcept
    : BoundaryObject(&kTable), _system(std::move(system)), _id(id) {}

EventClient::~EventClient() { _system->remove(_id); }

void EventClient::serve(void *client) noexcept {
    // A callback may unschedule the client and let go of the last reference but this.
    const auto self = Ref<EventClient>::retain(static_cast<EventClient *>(client));
    Entries::run([&] { self->_system->serve(self->_id); });
}

} // namespace ZorvaTouch::Host
