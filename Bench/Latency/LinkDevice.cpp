#include "Bench/Latency/LinkDevice.h"

namespace ZorvaTouch::Bench {
namespace {

class LinkDevice final : public BoundaryObject<LinkDevice, ZorvaDevice> {
public:
    LinkDevice(const Link &link, ReportObserver &observer)
        : BoundaryObject(&kTable), _link(link), _observer(observer) {}

private:
    static const ZorvaDeviceTable kTable;

    static ZorvaStatus openOrClose(ZorvaDevice *, std::uint32_t) noexcept { return ZORVA_STATUS_SUCCESS; }

    static void registerCallback(ZorvaDevice *device, std::uint8_t *buffer, std::size_t size,
                                 ZorvaInputReportCallback callback, void *context) noexcept {
        LinkDevice &self = of(device);
        self._buffer = {buffer, size};
        self._callback = callback;
        self._context = context;
    }

    static void schedule(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode) noexcept {
        LinkDevice &self = of(device);
        self._loop = Ref<ZorvaRunLoop>::retain(loop);
        self._source = loop->table->addDescriptor(loop, mode, self._link.readEnd(), readReport, &self);
    }

    static void unschedule(ZorvaDevice *device, ZorvaRunLoop *loop, const char *) noexcept {
        LinkDevice &self = of(device);
        loop->table->removeSource(loop, self._source);
        self._loop.reset();
    }

    static void readReport(void *context) noexcept {
        auto &self = *static_cast<LinkDevice *>(context);
        const std::size_t length = self._link.read(self._buffer);
        if (length == 0) {
            self._loop->table->removeSource(self._loop.get(), self._source);
            return;
        }
        self._observer.reportRead();
        self._callback(self._context, ZORVA_STATUS_SUCCESS, &self, 0, self._buffer[0], self._buffer.data(),
                       length, 0);
        self._observer.reportHandled();
    }

    static ZorvaStatus getFeatureReport(ZorvaDevice *, std::uint32_t, std::uint8_t *,
                                        std::size_t *) noexcept {
        return ZORVA_STATUS_UNSUPPORTED;
    }
    static const ZorvaValue *copyProperty(ZorvaDevice *, const char *) noexcept { return nullptr; }
    static ZorvaBoolean setProperty(ZorvaDevice *, const char *, const ZorvaValue *) noexcept { return 0; }

    const Link &_link;
    ReportObserver &_observer;
    std::span<std::uint8_t> _buffer;
    ZorvaInputReportCallback _callback = nullptr;
    void *_context = nullptr;
    Ref<ZorvaRunLoop> _loop;
    std::uint64_t _source = 0;
};

const ZorvaDeviceTable LinkDevice::kTable{
    .size = sizeof(ZorvaDeviceTable),
    .retain = LinkDevice::retain<ZorvaDevice>,
    .release = LinkDevice::release<ZorvaDevice>,
    .open = LinkDevice::openOrClose,
    .close = LinkDevice::openOrClose,
    .registerInputReportCallback = LinkDevice::registerCallback,
    .schedule = LinkDevice::schedule,
    .unschedule = LinkDevice::unschedule,
    .getFeatureReport = LinkDevice::getFeatureReport,
    .copyProperty = LinkDevice::copyProperty,
    .setProperty = LinkDevice::setProperty,
};

class LinkService final : public BoundaryObject<LinkService, ZorvaService> {
public:
    LinkService(const Link &link, ReportObserver &observer)
        : BoundaryObject(&kTable), _link(link), _observer(observer) {}

private:
    static const ZorvaServiceTable kTable;

    static ZorvaDevice *createDevice(ZorvaService *service) noexcept {
        return new LinkDevice(of(service)._link, of(service)._observer);
    }

    const Link &_link;
    ReportObserver &_observer;
};

const ZorvaServiceTable LinkService::kTable{
    .size = sizeof(ZorvaServiceTable),
    .retain = LinkService::retain<ZorvaService>,
    .release = LinkService::release<ZorvaService>,
    .createDevice = LinkService::createDevice,
    .createEventClient = nullptr,
    .setProperty = nullptr,
};

} // namespace

Ref<ZorvaService> makeLinkService(const Link &link, ReportObserver &observer) {
    return Ref<ZorvaService>::adopt(new LinkService(link, observer));
}

} // namespace ZorvaTouch::Bench
