#include "Tools/Stimulus/Replay.h"

#include <utility>

namespace ZorvaTouch::Tools {
namespace {} // namespace

Replay::Replay(FrameList frames, Ports::Clock &clock, Ports::LogProvider &logs)
    : _pipeline(std::make_shared<Pipeline>(logs)), _recording(std::move(frames), clock),
      _recorded(_recording.frames().begin()) {
    _recording.pipeline = _pipeline;
    _recording.playReset();
    watchPipeline();
}

void Replay::setState(const std::string &key, const PropertyValue &value) {
    _pipeline->setState(0, std::string(kAlgsDomain) + "." + key, value);
}

bool Replay::next(float speed) {
    if (!_recording.playCanContinue())
        return false;
    if (_playedCount > 0)
        ++_recorded;
    _frame.index = _playedCount++;
    _frame.timestampNs = recorded().timestampNs;
    _frame.isDisjoint = false;
    _frame.events.clear();
    _recording.playNextFrame(speed);
    return true;
}

std::int64_t Replay::offsetNs() const noexcept {
    return static_cast<std::int64_t>(_frame.timestampNs - (*frames().begin()).timestampNs);
}

std::string Replay::touchDescription() const {
    return _pipeline->algs().touchStateDescription(_frame.image.signals, _frame.image.timeMs);
}

std::string Replay::virtualDescription() const {
    return _pipeline->algs().virtualStateDescription(_frame.image.signals, _frame.image.timeMs);
}

void Replay::watchPipeline() {
    _pipeline->onSetState = [this](auto, const auto &, const auto &) { _frame.kind = InputKind::State; };
    _pipeline->onMetadata = [this](auto, const auto &, const auto &) { _frame.kind = InputKind::Metadata; };
    _pipeline->onUnhandledReport = [this](auto, auto, auto) { _frame.kind = InputKind::Unhandled; };
    _pipeline->onFirmwareEvent = [this](auto, const InputReport::FirmwareEvent *event) {
        const bool isReset = event->eventCode == InputReport::FirmwareEvent::kDeviceReset;
        _frame.kind = isReset ? InputKind::Reset : InputKind::Firmware;
        _frame.eventCode = event->eventCode;
    };
    _pipeline->onImage = [this](auto, const InputReport::Image *image) {
        _frame.kind = InputKind::Image;
        _frame.image = *image;
    };
    _pipeline->onDisjointImage = [this](auto, auto, auto) { _frame.isDisjoint = true; };
    _pipeline->onHIDEvents = [this](auto, const HostEventList &events) { _frame.events = events; };
}

} // namespace ZorvaTouch::Tools
