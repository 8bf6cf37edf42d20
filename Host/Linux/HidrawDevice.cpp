#include "Host/Linux/HidrawDevice.h"

#include "Host/Interface/Platform.h"
#include "Host/Linux/HidrawProperties.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <utility>

namespace ZorvaTouch::Linux {

using Host::MutexLock;

namespace {

constexpr std::uint32_t kInputReportType = 0;
constexpr std::uint32_t kLargestReportId = 0xFF;

bool isNothing(int errorNumber) noexcept {
    return errorNumber == EAGAIN || errorNumber == EWOULDBLOCK || errorNumber == EINTR;
}

bool isAbsent(int errorNumber) noexcept {
    return errorNumber == ENODEV || errorNumber == ENOENT || errorNumber == ENXIO;
}

} // namespace

Ref<HidrawDevice> HidrawDevice::create(HidrawOpener opener, std::shared_ptr<HidrawObserver> observer) {
    return Ref<HidrawDevice>::adopt(new HidrawDevice(std::move(opener), std::move(observer)));
}

HidrawDevice::HidrawDevice(HidrawOpener opener, std::shared_ptr<HidrawObserver> observer)
    : BoundaryObject(&kTable), _opener(std::move(opener)), _observer(std::move(observer)),
      _clock(Host::processPlatform().clock()) {}

// --- Reports -----------------------------------------------------------------------------------------------

void HidrawDevice::serve(void *device) noexcept {
    // The callback may unschedule the device and let go of the last reference but this.
    const auto self = Ref<HidrawDevice>::retain(static_cast<HidrawDevice *>(device));
    self->serveOne();
}

void HidrawDevice::serveOne() noexcept {
    std::shared_ptr<HidrawNode> node = currentNode();
    if (!node)
        return;
    const Callback callback = currentCallback();
    // A report that nobody waits for is read all the same, or it would wake the loop for ever.
    std::array<std::uint8_t, 1> unwanted{};
    const bool isWanted = callback.function && !callback.buffer.empty();
    const std::span<std::uint8_t> buffer = isWanted ? callback.buffer : unwanted;
    const IoResult result = node->read(buffer);
    if (result.errorNumber != 0 || result.count == 0)
        handleReadFailure(std::move(node), result.errorNumber);
    else if (isWanted)
        deliver(callback, std::min(result.count, buffer.size()));
    else
        drop();
}

void HidrawDevice::deliver(const Callback &callback, std::size_t length) noexcept {
    const std::uint64_t timestamp = _clock.nowTicks();
    {
        MutexLock lock(_lock);
        _failuresInARow = 0;
        ++_counters.reports;
    }
    if (_observer)
        _observer->onReport(timestamp, callback.buffer.first(length));
    const std::uint8_t *const report = callback.buffer.data();
    callback.function(callback.context, ZORVA_STATUS_SUCCESS, this, kInputReportType, report[0], report,
                      length, timestamp);
}

void HidrawDevice::drop() noexcept {
    MutexLock lock(_lock);
    _failuresInARow = 0;
    ++_counters.dropped;
}

void HidrawDevice::handleReadFailure(std::shared_ptr<HidrawNode> node, int errorNumber) noexcept {
    if (isNothing(errorNumber))
        return;
    const SystemFailure failure{"read", errorNumber};
    bool isGone = errorNumber == 0 || errorNumber == EIO || errorNumber == ENODEV;
    if (!isGone) {
        if (_observer)
            _observer->onFailure(failure);
        MutexLock lock(_lock);
        ++_counters.failures;
        isGone = ++_failuresInARow >= kFailuresUntilGone;
    }
    if (isGone)
        lose(std::move(node), failure);
}

void HidrawDevice::lose(std::shared_ptr<HidrawNode> node, const SystemFailure &reason) noexcept {
    {
        MutexLock lock(_lock);
        if (_node != node)
            return;
        _source.disconnect();
        _node.reset(); // closed below, without the lock
    }
    node.reset();
    if (_observer)
        _observer->onGone(reason);
}

// --- Coming and going --------------------------------------------------------------------------------------

ZorvaStatus HidrawDevice::open() {
    if (currentNode())
        return ZORVA_STATUS_SUCCESS;
    const OpenedNode opened = _opener();
    if (!opened.node)
        return refuse({"open", opened.errorNumber, opened.detail});
    PropertyValue::Dictionary properties;
    if (const int errorNumber = readProperties(*opened.node, properties))
        return refuse({"open", errorNumber});
    {
        MutexLock lock(_lock);
        _source.disconnect();
        _node = opened.node;
        _properties.swap(properties);
        _failuresInARow = 0;
        if (connect())
            return ZORVA_STATUS_SUCCESS;
        _node.reset();
    }
    return refuse({"open", ENOMEM});
}

ZorvaStatus HidrawDevice::refuse(const SystemFailure &failure) const noexcept {
    if (_observer)
        _observer->onFailure(failure);
    return isAbsent(failure.errorNumber) ? kStatusNoDevice : ZORVA_STATUS_NO_RESOURCES;
}

void HidrawDevice::close() noexcept {
    std::shared_ptr<HidrawNode> closed; // without the lock
    MutexLock lock(_lock);
    _source.disconnect();
    closed.swap(_node);
}

void HidrawDevice::setCallback(const Callback &callback) noexcept {
    MutexLock lock(_lock);
    _callback = callback;
}

void HidrawDevice::schedule(ZorvaRunLoop *loop, const char *mode) {
    leaveLoop();
    std::shared_ptr<HidrawNode> unwatched;
    {
        MutexLock lock(_lock);
        _source.schedule(loop, mode);
        _scheduled = Ref<HidrawDevice>::retain(this);
        if (!connect())
            unwatched = _node;
    }
    if (unwatched)
        lose(std::move(unwatched), {"watch", ENOMEM});
}

bool HidrawDevice::connect() noexcept { return !_node || _source.connect(_node->descriptor(), serve, this); }

void HidrawDevice::unschedule(const ZorvaRunLoop *loop, const char *mode) noexcept {
    bool isPlace;
    {
        MutexLock lock(_lock);
        isPlace = _source.isScheduledOn(loop, mode);
    }
    if (isPlace)
        leaveLoop();
}

void HidrawDevice::leaveLoop() noexcept {
    // Released in the opposite order, after the lock: the loop, then perhaps the device itself.
    Ref<HidrawDevice> self;
    Ref<ZorvaRunLoop> loop;
    {
        MutexLock lock(_lock);
        loop = _source.unschedule();
        self = std::move(_scheduled);
    }
    if (self && _observer)
        _observer->onUnscheduled();
}

// --- Answers -----------------------------------------------------------------------------------------------

ZorvaStatus HidrawDevice::readFeatureReport(std::uint32_t reportId, std::span<std::uint8_t> buffer,
                                            std::size_t &stored) const noexcept {
    stored = 0;
    const std::shared_ptr<HidrawNode> node = currentNode();
    if (!node)
        return kStatusNoDevice;
    if (buffer.empty() || reportId > kLargestReportId)
        return ZORVA_STATUS_NO_RESOURCES;
    buffer[0] = static_cast<std::uint8_t>(reportId);
    const IoResult result = node->featureReport(buffer);
    if (result.errorNumber != 0)
        return result.errorNumber == ENODEV ? kStatusNoDevice : ZORVA_STATUS_NO_RESOURCES;
    stored = std::min(result.count, buffer.size());
    return ZORVA_STATUS_SUCCESS;
}

PropertyValue HidrawDevice::property(const char *key) const {
    MutexLock lock(_lock);
    const auto found = key ? _properties.find(key) : _properties.end();
    return found == _properties.end() ? PropertyValue() : found->second;
}

HidrawCounters HidrawDevice::counters() const {
    MutexLock lock(_lock);
    return _counters;
}

std::shared_ptr<HidrawNode> HidrawDevice::currentNode() const noexcept {
    MutexLock lock(_lock);
    return _node;
}

HidrawDevice::Callback HidrawDevice::currentCallback() const noexcept {
    MutexLock lock(_lock);
    return _callback;
}

} // namespace ZorvaTouch::Linux
