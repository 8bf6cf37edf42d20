#include "Tools/Daemon/SimulatedSurface.h"

#include "Host/Interface/Mutex.h"
#include "Host/Interface/Platform.h"

#include <string>
#include <utility>

namespace ZorvaTouch::Tools {

/// Threads: any.
class SimulatedSurface::Observers {
public:
    void set(const std::shared_ptr<Linux::HidrawObserver> &observer) {
        const Host::MutexLock lock(_lock);
        _observer = observer;
    }
    void notify(const Frame &report) const noexcept {
        std::shared_ptr<Linux::HidrawObserver> observer; // used, and perhaps destroyed, without the lock
        {
            const Host::MutexLock lock(_lock);
            observer = _observer.lock();
        }
        if (observer)
            observer->onReport(Host::processPlatform().clock().nowTicks(), report.data);
    }

private:
    mutable Host::Mutex _lock;
    std::weak_ptr<Linux::HidrawObserver> _observer ZORVA_GUARDED_BY(_lock);
};

SimulatedSurface::SimulatedSurface(const SimulatedFinger &finger, bool hasAccelerometer,
                                   Linux::MainLoop &loop, std::function<void()> onFinished)
    : _finger(finger), _loop(loop), _onFinished(std::move(onFinished)),
      _events(hasAccelerometer ? Host::EventSystem::create() : nullptr), _device(Simulated::Device::create()),
      _isThere(std::make_shared<bool>(true)), _observers(std::make_shared<Observers>()),
      _player(frames(),
              {.device = _device,
               .accelerometer = _events ? Host::Accelerometer::create(_events) : Ref<Host::Accelerometer>(),
               .onReport = [observers = _observers](const Frame &frame) { observers->notify(frame); },
               .onMetadata = nullptr,
               .onState = nullptr}) {}

SimulatedSurface::~SimulatedSurface() { *_isThere = false; }

SurfaceName SimulatedSurface::name() const {
    const std::string name = "sim:" + std::string(_finger.scenario->name);
    return {.id = name, .node = name, .name = "simulated surface"};
}

DeviceMaker SimulatedSurface::maker() const {
    return
        [device = _device, observers = _observers](const std::shared_ptr<Linux::HidrawObserver> &observer) {
            observers->set(observer);
            return device;
        };
}

void SimulatedSurface::play() { _player.start(Host::processPlatform()); }

/// The finger's, and word to the main thread after the last.
Simulated::FrameSource SimulatedSurface::frames() {
    return [this, next = framesOf(_finger)]() -> std::optional<Frame> {
        std::optional<Frame> frame = next();
        if (!frame)
            _loop.post([this, isThere = _isThere] {
                if (!*isThere)
                    return;
                _device->waitUntilHandled();
                _onFinished();
            });
        return frame;
    };
}

} // namespace ZorvaTouch::Tools
