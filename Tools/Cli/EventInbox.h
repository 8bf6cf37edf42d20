#pragma once

#include "Plugin/ZorvaPlugIn.h"
#include "Shared/HostEvent.h"
#include "Shared/InputReport.h"

#include <chrono>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <optional>
#include <vector>

namespace ZorvaTouch::Tools {

/// Where a run's other threads leave what the command's own thread shows: the service's events, the device's
/// latest image, and that it is time to end.
///
/// Threads: any, several at a time.
class EventInbox {
public:
    using Events = std::vector<std::shared_ptr<HostEvent>>;

    /// A `ZorvaEventCallback`; the target is the inbox. Events of unknown types are left out.
    static void receive(void *target, void *refcon, void *sender, const ZorvaEvent *event,
                        std::uint32_t options) noexcept;

    void putImage(const InputReport::Image &image);
    /// There is nothing more to play.
    void finish() noexcept;
    /// Somebody wants an end.
    void stop() noexcept;

    /// Waits for something new, but no longer than this. @return Whether the run goes on.
    [[nodiscard]] bool waitFor(std::chrono::milliseconds longest);
    [[nodiscard]] bool isStopped() const;

    /// The events since the last call, in order.
    [[nodiscard]] Events takeEvents();
    [[nodiscard]] std::optional<InputReport::Image> latestImage() const;

private:
    void putEvent(std::shared_ptr<HostEvent> event);
    void raise(bool &flag) noexcept;

    mutable std::mutex _lock;
    std::condition_variable _changed;
    // Under the lock.
    Events _events;
    std::optional<InputReport::Image> _image;
    bool _isFinished = false;
    bool _isStopped = false;
};

} // namespace ZorvaTouch::Tools
