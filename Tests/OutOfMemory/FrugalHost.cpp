#include "Tests/OutOfMemory/FrugalHost.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Testing {
namespace {

class CountedLog final : public Ports::Log {
public:
    explicit CountedLog(std::shared_ptr<std::atomic<std::uint64_t>> errors) : _errors(std::move(errors)) {}

    [[nodiscard]] bool isEnabled(Ports::LogLevel) const noexcept override { return true; }
    void write(Ports::LogLevel level, std::string_view) noexcept override {
        *_errors += level == Ports::LogLevel::Error;
    }

private:
    const std::shared_ptr<std::atomic<std::uint64_t>> _errors;
};

} // namespace

std::shared_ptr<Ports::Log> CountedLogs::openLog(std::string_view, std::string_view) {
    return std::make_shared<CountedLog>(_errors);
}

FrugalPlatform::FrugalPlatform()
    : _nowhere(std::fopen("/dev/null", "w"), std::fclose), _system("error", _nowhere.get()) {}

// --- The queue -----------------------------------------------------------------------------------

const ZorvaQueueTable FrugalQueue::kTable{
    .size = sizeof(ZorvaQueueTable),
    .retain = FrugalQueue::retain<ZorvaQueue>,
    .release = FrugalQueue::release<ZorvaQueue>,
    .submit = FrugalQueue::submit,
};

FrugalQueue::~FrugalQueue() {
    for (std::size_t i = 0; i < _count; ++i)
        _jobs[i].discard(_jobs[i].context);
}

ZorvaBoolean FrugalQueue::submit(ZorvaQueue *queue, ZorvaFunction run, ZorvaFunction discard,
                                 void *context) noexcept {
    FrugalQueue &self = of(queue);
    const std::lock_guard guard(self._lock);
    if (self._count == self._jobs.size())
        return 0;
    self._jobs[self._count++] = {run, discard, context};
    return 1;
}

std::size_t FrugalQueue::runAll() {
    std::array<Job, 64> jobs{};
    std::size_t count = 0;
    {
        const std::lock_guard guard(_lock);
        jobs = _jobs;
        count = std::exchange(_count, 0);
    }
    for (std::size_t i = 0; i < count; ++i)
        jobs[i].run(jobs[i].context);
    return count;
}

// --- The device ----------------------------------------------------------------------------------

struct FrugalDevice::Entries {
    static ZorvaStatus open(ZorvaDevice *, std::uint32_t) noexcept { return ZORVA_STATUS_SUCCESS; }
    static void registerInputReportCallback(ZorvaDevice *device, std::uint8_t *, std::size_t,
                                            ZorvaInputReportCallback callback, void *context) noexcept {
        const std::lock_guard guard(of(device)._lock);
        of(device)._callback = callback;
        of(device)._context = context;
    }
    static void schedule(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode) noexcept {
        const std::lock_guard guard(of(device)._lock);
        of(device)._loop = Ref<ZorvaRunLoop>::retain(loop);
        of(device)._source = loop->table->addSource(loop, mode, perform, device);
        of(device)._isScheduled.notify_all();
    }
    static void unschedule(ZorvaDevice *device, ZorvaRunLoop *loop, const char *) noexcept {
        const std::lock_guard guard(of(device)._lock);
        if (const auto source = std::exchange(of(device)._source, 0))
            loop->table->removeSource(loop, source);
        of(device)._loop.reset();
    }
    static ZorvaStatus getFeatureReport(ZorvaDevice *, std::uint32_t reportId, std::uint8_t *buffer,
                                        std::size_t *length) noexcept {
        std::fill_n(buffer, *length, static_cast<std::uint8_t>(reportId));
        return ZORVA_STATUS_SUCCESS;
    }
    static const ZorvaValue *copyProperty(ZorvaDevice *device, const char *) noexcept {
        return Ref<const ZorvaValue>::retain(of(device).property).release();
    }
    static ZorvaBoolean setProperty(ZorvaDevice *device, const char *, const ZorvaValue *) noexcept {
        ++of(device).propertyWrites;
        return 1;
    }
    static void perform(void *device) noexcept {
        FrugalDevice &self = of(static_cast<ZorvaDevice *>(device));
        (*self._around)([&self] {
            self._callback(self._context, ZORVA_STATUS_SUCCESS, &self, 0, self._report[0],
                           self._report.data(), self._report.size(), 0);
        });
        self._isDelivered->signal();
    }
};

const ZorvaDeviceTable FrugalDevice::kTable{
    .size = sizeof(ZorvaDeviceTable),
    .retain = FrugalDevice::retain<ZorvaDevice>,
    .release = FrugalDevice::release<ZorvaDevice>,
    .open = Entries::open,
    .close = Entries::open,
    .registerInputReportCallback = Entries::registerInputReportCallback,
    .schedule = Entries::schedule,
    .unschedule = Entries::unschedule,
    .getFeatureReport = Entries::getFeatureReport,
    .copyProperty = Entries::copyProperty,
    .setProperty = Entries::setProperty,
};

FrugalDevice::FrugalDevice()
    : BoundaryObject(&kTable), _isDelivered(Host::processPlatform().createSemaphore()) {}

void FrugalDevice::deliver(std::span<const std::uint8_t> report, const Around &around) {
    {
        std::unique_lock guard(_lock);
        _isScheduled.wait(guard, [this] { return _source != 0; });
        _report = report;
        _around = &around;
        _loop->table->signalSource(_loop.get(), _source);
    }
    _isDelivered->wait();
}

// --- The event system ----------------------------------------------------------------------------

struct FrugalEventClient::Entries {
    static void setMatching(ZorvaEventClient *, const ZorvaValue *) noexcept {}
    static std::size_t copyServices(ZorvaEventClient *client, ZorvaService **services,
                                    std::size_t capacity) noexcept {
        if (capacity != 0)
            *services = Ref<ZorvaService>::retain(of(client).found).release();
        return 1;
    }
    static void registerCallback(ZorvaEventClient *client, ZorvaEventClientCallback callback,
                                 void *context) noexcept {
        of(client)._callback = callback;
        of(client)._context = context;
    }
    static void unregisterCallback(ZorvaEventClient *, ZorvaEventClientCallback, void *) noexcept {}
    static void schedule(ZorvaEventClient *, ZorvaRunLoop *, const char *) noexcept {}
};

const ZorvaEventClientTable FrugalEventClient::kTable{
    .size = sizeof(ZorvaEventClientTable),
    .retain = FrugalEventClient::retain<ZorvaEventClient>,
    .release = FrugalEventClient::release<ZorvaEventClient>,
    .setMatching = Entries::setMatching,
    .copyServices = Entries::copyServices,
    .registerCallback = Entries::registerCallback,
    .unregisterCallback = Entries::unregisterCallback,
    .schedule = Entries::schedule,
    .unschedule = Entries::schedule,
};

// --- The service ---------------------------------------------------------------------------------

const ZorvaServiceTable FrugalService::kTable{
    .size = sizeof(ZorvaServiceTable),
    .retain = FrugalService::retain<ZorvaService>,
    .release = FrugalService::release<ZorvaService>,
    .createDevice = [](ZorvaService *service) noexcept -> ZorvaDevice * {
        return Ref<ZorvaDevice>::retain(of(service)._device.get()).release();
    },
    .createEventClient = [](ZorvaService *service, std::uint32_t) noexcept -> ZorvaEventClient * {
        return Ref<ZorvaEventClient>::retain(of(service)._client.get()).release();
    },
    .setProperty = nullptr,
};

} // namespace ZorvaTouch::Testing
