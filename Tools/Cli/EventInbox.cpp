#include "Tools/Cli/EventInbox.h"

#include "Plugin/EventObject.h"

#include <new>
#include <utility>

namespace ZorvaTouch::Tools {

void EventInbox::receive(void *target, void * /*refcon*/, void * /*sender*/, const ZorvaEvent *event,
                         std::uint32_t /*options*/) noexcept {
    auto &inbox = *static_cast<EventInbox *>(target);
    try {
        inbox.putEvent(readEvent(event));
    } catch (const std::bad_alloc &) { // an event is lost; the comparison in the end will tell
    }
}

void EventInbox::putEvent(std::shared_ptr<HostEvent> event) {
    if (!event)
        return;
    {
        const std::lock_guard lock(_lock);
        _events.push_back(std::move(event));
    }
    _changed.notify_one();
}

void EventInbox::putImage(const InputReport::Image &image) {
    const std::lock_guard lock(_lock);
    _image = image;
}

void EventInbox::finish() noexcept { raise(_isFinished); }

void EventInbox::stop() noexcept { raise(_isStopped); }

bool EventInbox::waitFor(std::chrono::milliseconds longest) {
    std::unique_lock lock(_lock);
    _changed.wait_for(lock, longest, [this] { return !_events.empty() || _isFinished || _isStopped; });
    return !_isFinished && !_isStopped;
}

bool EventInbox::isStopped() const {
    const std::lock_guard lock(_lock);
    return _isStopped;
}

EventInbox::Events EventInbox::takeEvents() {
    const std::lock_guard lock(_lock);
    return std::exchange(_events, {});
}

std::optional<InputReport::Image> EventInbox::latestImage() const {
    const std::lock_guard lock(_lock);
    return _image;
}

void EventInbox::raise(bool &flag) noexcept {
    {
        const std::lock_guard lock(_lock);
        flag = true;
    }
    _changed.notify_one();
}

} // namespace ZorvaTouch::Tools
