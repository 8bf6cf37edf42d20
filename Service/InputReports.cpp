#include "Service/DeliveryBatch.h"
#include "Service/ZorvaTouchHIDService.h"

#include <span>

namespace ZorvaTouch {
namespace {

std::uint64_t byteOrZero(std::span<const std::uint8_t> bytes, std::size_t index) {
    return index < bytes.size() ? bytes[index] : 0;
}

/// Eight bytes as one number, the first the most significant.
std::uint64_t bigEndianNumber(const std::array<std::uint8_t, 8> &bytes) {
    std::uint64_t number = 0;
    for (const std::uint8_t byte : bytes)
        number = number << 8 | byte;
    return number;
}

} // namespace

// ---- Reports and samples come in

void ZorvaTouchHIDService::inputReportCallback(void *context, ZorvaStatus /*result*/, void * /*sender*/,
                                               std::uint32_t type, std::uint32_t reportId,
                                               const std::uint8_t *report, std::size_t length,
                                               std::uint64_t timestamp) noexcept {
    auto &self = *static_cast<ZorvaTouchHIDService *>(context);
    runGuarded(self._log, "input report",
               [&] { self.handleInputReport(type, reportId & 0xFF, report, length, timestamp); });
}

void ZorvaTouchHIDService::handleInputReport(std::uint32_t type, std::uint32_t reportId,
                                             const std::uint8_t *report, std::size_t length,
                                             std::uint64_t timestamp) {
    _log.debug("Received input report (type {}, reportID {}, reportLength {}, timestampMach {})", type,
               reportId, length, timestamp);
    if (!report)
        length = 0;
    const Host::MutexLock lock(_pipelineLock);
    // The time of this call, not the report's own: live and replayed, inputs have one clock.
    _recording.handleInputReport(_platform.clock().nowTicks(), report, length);
}

void ZorvaTouchHIDService::handleAccelEvent(const HostEvent &event) {
    const AccelerometerFields &fields = *event.accelerometer();
    const AccelSample sample{_platform.clock().nowTicks(), fields.x, fields.y, fields.z};
    const Host::MutexLock lock(_pipelineLock);
    _accel.handleSample(sample, _recording);
}

// ---- The pipeline's hooks: called under the lock, by reports that this thread feeds

void ZorvaTouchHIDService::installHooks(const DispatchEventInfo &info) {
    const Host::MutexLock lock(_pipelineLock);
    installProbes();
    _pipeline->onHIDEvents = [this, info](std::uint64_t, const HostEventList &events) {
        runGuarded(_log, "dispatch", [&] {
            _pipelineLock.assertHeld();
            handOverEvents(events, info);
        });
    };
}

void ZorvaTouchHIDService::installProbes() {
    _pipeline->onInputReport = [this](std::uint64_t, const std::uint8_t *data, std::size_t length) {
        traceInputReport(data, length);
        _log.debug("Input report probe");
    };
    _pipeline->onUnhandledReport = [this](std::uint64_t, const std::uint8_t *data, std::size_t length) {
        if (length != 0)
            _log.debug("Invalid input report with ID {}", data[0]);
        else
            _log.debug("Invalid input report len==0");
    };
    _pipeline->onFirmwareEvent = [this](std::uint64_t, const InputReport::FirmwareEvent *event) {
        traceFirmwareEvent(*event);
        _log.notice("Firmware event probe; event: {:x}, context: {:x}", event->eventCode,
                    bigEndianNumber(event->payload));
    };
    _pipeline->onImage = [this](std::uint64_t, const InputReport::Image *image) {
        _log.debug("Received image frame: {}", image->frameNumber);
    };
    // The line breaks are part of the text: they set the place apart in a long log.
    _pipeline->onDisjointImage = [this](std::uint64_t, std::uint32_t previous,
                                        const InputReport::Image *image) {
        _log.error("Disjoint image (frame number: {} -> {})\n\n", previous, image->frameNumber);
    };
}

void ZorvaTouchHIDService::clearHooks() noexcept {
    const Host::MutexLock lock(_pipelineLock);
    _pipeline->onInputReport = nullptr;
    _pipeline->onUnhandledReport = nullptr;
    _pipeline->onFirmwareEvent = nullptr;
    _pipeline->onImage = nullptr;
    _pipeline->onDisjointImage = nullptr;
    _pipeline->onHIDEvents = nullptr;
}

void ZorvaTouchHIDService::traceInputReport(const std::uint8_t *data, std::size_t length) const noexcept {
    const std::span bytes(data, length);
    _platform.trace().emit(Host::Trace::kInputReport, byteOrZero(bytes, 0), byteOrZero(bytes, 1),
                           byteOrZero(bytes, 2), byteOrZero(bytes, 3));
}

void ZorvaTouchHIDService::traceFirmwareEvent(const InputReport::FirmwareEvent &event) const noexcept {
    _platform.trace().emit(Host::Trace::kFirmwareEvent, event.eventCode, bigEndianNumber(event.payload));
}

// ---- Events go out

void ZorvaTouchHIDService::handOverEvents(const HostEventList &events, const DispatchEventInfo &info) {
    _log.debug("HID events probe: {} event(s)", events.size());
    // Whatever becomes of the batch: the gesture happened, and the recording shall show its surroundings.
    for (const std::shared_ptr<HostEvent> &event : events)
        if (event->type() == HostEventType::Digitizer)
            _accel.requestSamples();
    if (events.empty())
        return;
    _log.debug("Dispatch {} event(s) takeoff", events.size());
    DeliveryBatch::submit(std::make_unique<DeliveryBatch>(*this, _log, _platform.trace(), events, info));
}

} // namespace ZorvaTouch
