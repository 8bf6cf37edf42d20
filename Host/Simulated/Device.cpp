#include "Host/Simulated/Device.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Simulated {

using Host::MutexLock;

Ref<Device> Device::create() { return Ref<Device>::adopt(new Device); }

Device::Device()
    : BoundaryObject(&kTable), _properties({
                                   {"Product", "Simulated touch sensor"},
                                   {"SerialNumber", "SIM0001"},
                                   {"VendorID", 0x1234u},
                                   {"ProductID", 0xABCDu},
                               }) {}

// --- Reports -----------------------------------------------------------------------------------------------

bool Device::deliver(std::span<const std::uint8_t> report, std::uint64_t timestamp) {
    Report copy{{report.begin(), report.end()}, timestamp};
    MutexLock lock(_lock);
    const bool isQueued = _isPlugged && _inbox.push(std::move(copy));
    if (!isQueued)
        ++_counters.dropped;
    return isQueued;
}

void Device::waitUntilHandled() {
    MutexLock lock(_lock);
    const std::uint64_t delivered = _inbox.accepted();
    while (_inbox.mustWaitFor(delivered))
        _settled.wait(_lock);
}

void Device::serve(void *device) noexcept {
    // The callback may unschedule the device and let go of the last reference but this.
    const auto self = Ref<Device>::retain(static_cast<Device *>(device));
    self->serveOne();
}

void Device::serveOne() noexcept {
    const std::optional<Delivery> delivery = takeReport();
    if (!delivery)
        return;
    const Callback &callback = delivery->callback;
    callback.function(callback.context, ZORVA_STATUS_SUCCESS, this, 0, delivery->reportId,
                      callback.buffer.data(), delivery->length, delivery->timestamp);
    finishReport();
}

std::optional<Device::Delivery> Device::takeReport() {
    MutexLock lock(_lock);
    if (!_callback.function) {
        dropWaiting();
        return std::nullopt;
    }
    const std::optional<Report> report = _inbox.take();
    if (!report)
        return std::nullopt;
    const std::vector<std::uint8_t> &bytes = report->bytes;
    const std::size_t length = std::min(bytes.size(), _callback.buffer.size());
    std::copy_n(bytes.begin(), length, _callback.buffer.begin());
    return Delivery{_callback, bytes.empty() ? 0u : bytes.front(), length, report->timestamp};
}

void Device::finishReport() {
    MutexLock lock(_lock);
    ++_counters.handled;
    _inbox.finish();
    _settled.notify_all();
}

void Device::dropWaiting() {
    _counters.dropped += _inbox.discard();
    _settled.notify_all();
}

// --- Coming and going --------------------------------------------------------------------------------------

ZorvaStatus Device::open(std::uint32_t options) {
    MutexLock lock(_lock);
    _counters.openOptions = options;
    const ZorvaStatus status = _isPlugged ? _openStatus : kStatusNoDevice;
    if (status == ZORVA_STATUS_SUCCESS)
        ++_counters.opened;
    return status;
}

ZorvaStatus Device::close(std::uint32_t options) {
    MutexLock lock(_lock);
    _counters.closeOptions = options;
    dropWaiting();
    if (_closeStatus == ZORVA_STATUS_SUCCESS)
        ++_counters.closed;
    return _closeStatus;
}

void Device::setCallback(const Callback &callback) {
    MutexLock lock(_lock);
    _callback = callback;
}

void Device::schedule(ZorvaRunLoop *loop, const char *mode) {
    leaveLoop();
    MutexLock lock(_lock);
    _inbox.schedule(loop, mode, serve, this);
    _scheduled = Ref<Device>::retain(this);
    if (_isPlugged)
        _inbox.connect();
}

void Device::unschedule(const ZorvaRunLoop *loop, const char *mode) {
    bool isPlace;
    {
        MutexLock lock(_lock);
        isPlace = _inbox.isScheduledOn(loop, mode);
    }
    if (isPlace)
        leaveLoop();
}

void Device::leaveLoop() noexcept {
    // Released in the opposite order, after the lock: the loop, then perhaps the device itself.
    Ref<Device> self;
    Ref<ZorvaRunLoop> loop;
    MutexLock lock(_lock);
    loop = _inbox.unschedule();
    self = std::move(_scheduled);
    _settled.notify_all();
}

void Device::unplug() {
    MutexLock lock(_lock);
    _isPlugged = false;
    _inbox.disconnect();
    dropWaiting();
}

void Device::plug() {
    MutexLock lock(_lock);
    _isPlugged = true;
}

// --- Answers -----------------------------------------------------------------------------------------------

ZorvaStatus Device::readFeatureReport(std::uint32_t reportId, std::span<std::uint8_t> buffer,
                                      std::size_t &stored) const {
    MutexLock lock(_lock);
    if (_isPlugged)
        return _featureReports.read(reportId, buffer, stored);
    stored = 0;
    return kStatusNoDevice;
}

void Device::setOpenStatus(ZorvaStatus status) {
    MutexLock lock(_lock);
    _openStatus = status;
}

void Device::setCloseStatus(ZorvaStatus status) {
    MutexLock lock(_lock);
    _closeStatus = status;
}

void Device::setFeatureReport(std::uint32_t reportId, std::vector<std::uint8_t> report) {
    MutexLock lock(_lock);
    _featureReports.answer(reportId, std::move(report));
}

void Device::failFeatureReport(std::uint32_t reportId, ZorvaStatus status) {
    MutexLock lock(_lock);
    _featureReports.fail(reportId, status);
}

DeviceCounters Device::counters() const {
    MutexLock lock(_lock);
    DeviceCounters counters = _counters;
    counters.references = _referenceCount.load();
    return counters;
}

} // namespace ZorvaTouch::Simulated
