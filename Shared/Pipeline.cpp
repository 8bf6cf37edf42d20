#include "Shared/Pipeline.h"

#include "Shared/Util/StateKey.h"

#include <string_view>
#include <utility>

namespace ZorvaTouch {
namespace {

constexpr std::string_view kDebugInfoKey = "DebugInfo";
constexpr std::uint16_t kVendorUsagePage = 0xFF60;
constexpr std::uint16_t kVendorUsageDeviceReset = 2;

/// Calls a hook if it is set. A hook that throws ends the process here.
template <typename... Parameters, typename... Arguments>
void callHook(const std::function<void(Parameters...)> &hook, Arguments &&...arguments) noexcept {
    if (hook)
        hook(std::forward<Arguments>(arguments)...);
}

/// Marks the reset for the host. It carries nothing of the firmware event's payload; that is meant.
std::shared_ptr<HostEvent> createDeviceResetEvent() {
    return HostEvent::createVendorDefined(
        0, {.usagePage = kVendorUsagePage, .usage = kVendorUsageDeviceReset, .version = 0, .payload = {}}, 0);
}

} // namespace

Pipeline::Pipeline(Ports::LogProvider &logs) : _algs(logs) {}

void Pipeline::setState(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) {
    callHook(onSetState, timestamp, key, value);
    std::string rest = key;
    if (Util::stripDomainFromKey(rest, kAlgsDomain))
        _algs.setState(rest, value);
}

PropertyValue Pipeline::getState(const std::string &key) const {
    callHook(onGetState, key);
    std::string rest = key;
    if (Util::stripDomainFromKey(rest, kAlgsDomain))
        return _algs.getState(rest);
    if (key == kDebugInfoKey)
        return PropertyValue::Dictionary{{"ResetCount", _resetCount},
                                         {"DisjointImageCount", _disjointImageCount}};
    return {};
}

void Pipeline::handleMetadata(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) {
    callHook(onMetadata, timestamp, key, value);
}

void Pipeline::handleInputReport(std::uint64_t timestamp, const std::uint8_t *data, std::size_t length) {
    callHook(onInputReport, timestamp, data, length);
    if (const auto event = InputReport::FirmwareEvent::parse(data, length))
        handleFirmwareEvent(timestamp, *event);
    else if (const auto image = InputReport::Image::parse(data, length))
        handleImage(timestamp, *image);
    else
        callHook(onUnhandledReport, timestamp, data, length);
}

void Pipeline::handleFirmwareEvent(std::uint64_t timestamp, const InputReport::FirmwareEvent &event) {
    callHook(onFirmwareEvent, timestamp, &event);
    if (event.eventCode == InputReport::FirmwareEvent::kDeviceReset)
        handleDeviceReset(timestamp);
}

void Pipeline::handleDeviceReset(std::uint64_t timestamp) {
    ++_resetCount;
    HostEventList events = _algs.handleReset();
    events.push_back(createDeviceResetEvent());
    handleHIDEvents(timestamp, events);
}

void Pipeline::handleImage(std::uint64_t timestamp, const InputReport::Image &image) {
    callHook(onImage, timestamp, &image);
    checkContinuity(timestamp, image);
    handleHIDEvents(timestamp, _algs.handleImage(image));
}

void Pipeline::checkContinuity(std::uint64_t timestamp, const InputReport::Image &image) {
    if (_hasLastFrame && image.frameNumber != _lastFrameNumber + 1) {
        ++_disjointImageCount;
        callHook(onDisjointImage, timestamp, _lastFrameNumber, &image);
    }
    _lastFrameNumber = image.frameNumber;
    _hasLastFrame = true;
}

void Pipeline::handleHIDEvents(std::uint64_t timestamp, const HostEventList &events) {
    for (const auto &event : events)
        event->setTimestamp(timestamp);
    if (!events.empty())
        callHook(onHIDEvents, timestamp, events);
}

} // namespace ZorvaTouch
