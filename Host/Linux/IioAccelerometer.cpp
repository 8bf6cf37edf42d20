#include "Host/Linux/IioAccelerometer.h"

#include "Host/Linux/IioReader.h"

#include <utility>

namespace ZorvaTouch::Linux {
namespace {

constexpr const char *kThreadName = "zorva-accel";

} // namespace

IioAccelerometer::IioAccelerometer(const std::shared_ptr<Host::EventSystem> &system,
                                   const AccelIdentity &identity, IioOpener opener,
                                   std::shared_ptr<Ports::Log> log)
    : _reader(std::make_shared<IioReader>(identity, std::move(opener), std::move(log))),
      _accelerometer(Host::Accelerometer::create(system, _reader)) {
    try {
        _thread = Host::processPlatform().startThread(
            kThreadName,
            [reader = _reader, accelerometer = _accelerometer] { reader->run(*accelerometer.get()); });
    } catch (...) {
        _accelerometer->withdraw();
        throw;
    }
}

IioAccelerometer::~IioAccelerometer() {
    leave();
    _thread->join();
}

void IioAccelerometer::leave() noexcept {
    _accelerometer->withdraw();
    _reader->end();
}

bool IioAccelerometer::hasLeft() const noexcept { return _reader->hasEnded(); }

} // namespace ZorvaTouch::Linux
