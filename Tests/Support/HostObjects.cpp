#include "Tests/Support/HostObjects.h"

#include <utility>

namespace ZorvaTouch::Testing {

const ZorvaValueTable EndlessValue::kTable{
    .size = sizeof(ZorvaValueTable),
    .retain = [](const ZorvaValue *) {},
    .release = [](const ZorvaValue *) {},
    .kind = [](const ZorvaValue *) { return std::uint32_t{kZorvaValueArray}; },
    .booleanValue = [](const ZorvaValue *) { return ZorvaBoolean{0}; },
    .unsignedValue = [](const ZorvaValue *) { return std::uint64_t{0}; },
    .doubleValue = [](const ZorvaValue *) { return 0.0; },
    .stringValue = [](const ZorvaValue *, std::size_t *) -> const char * { return nullptr; },
    .bytesValue = [](const ZorvaValue *, std::size_t *) -> const std::uint8_t * { return nullptr; },
    .count = [](const ZorvaValue *) { return std::size_t{1}; },
    .element = [](const ZorvaValue *value, std::size_t) { return value; },
    .key = [](const ZorvaValue *, std::size_t, std::size_t *) -> const char * { return nullptr; },
};

// --- The queue -----------------------------------------------------------------------------------

const ZorvaQueueTable ManualQueue::kTable{
    .size = sizeof(ZorvaQueueTable),
    .retain = ManualQueue::retain,
    .release = ManualQueue::release,
    .submit = ManualQueue::submit,
};

ZorvaBoolean ManualQueue::submit(ZorvaQueue *queue, ZorvaFunction run, ZorvaFunction discard,
                                 void *context) noexcept {
    ManualQueue &self = of(queue);
    const std::lock_guard guard(self._lock);
    ++self._submitted;
    if (self._isRefused)
        return 0;
    self._jobs.push_back({run, discard, context});
    return 1;
}

bool ManualQueue::take(Job &job) {
    const std::lock_guard guard(_lock);
    if (_jobs.empty())
        return false;
    job = _jobs.front();
    _jobs.pop_front();
    return true;
}

std::size_t ManualQueue::runAll() {
    std::size_t count = 0;
    for (Job job{}; take(job); ++count)
        job.run(job.context);
    return count;
}

std::size_t ManualQueue::discardAll() {
    std::size_t count = 0;
    for (Job job{}; take(job); ++count)
        job.discard(job.context);
    return count;
}

std::size_t ManualQueue::waiting() const {
    const std::lock_guard guard(_lock);
    return _jobs.size();
}

std::size_t ManualQueue::submitted() const {
    const std::lock_guard guard(_lock);
    return _submitted;
}

// --- The device ----------------------------------------------------------------------------------

struct ProbeDevice::Entries {
    static ZorvaStatus open(ZorvaDevice *device, std::uint32_t options) noexcept {
        of(device).note("open " + std::to_string(options));
        return of(device).openStatus;
    }
    static ZorvaStatus close(ZorvaDevice *device, std::uint32_t options) noexcept {
        of(device).note("close " + std::to_string(options));
        return ZORVA_STATUS_SUCCESS;
    }
    static void registerInputReportCallback(ZorvaDevice *device, std::uint8_t *buffer, std::size_t size,
                                            ZorvaInputReportCallback callback, void *context) noexcept {
        ProbeDevice &self = of(device);
        self.note((callback ? "register " : "unregister ") + std::to_string(size));
        const std::lock_guard guard(self._lock);
        self._registration = {{buffer, size}, callback, context};
    }
    static void schedule(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode) noexcept {
        ProbeDevice &self = of(device);
        self.note(std::string("schedule ") + mode);
        const std::lock_guard guard(self._lock);
        self._loop = Ref<ZorvaRunLoop>::retain(loop);
        self._source = loop->table->addSource(loop, mode, perform, &self);
        if (!self._work.empty())
            loop->table->signalSource(loop, self._source);
    }
    static void unschedule(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode) noexcept {
        ProbeDevice &self = of(device);
        self.note(std::string("unschedule ") + mode);
        const std::lock_guard guard(self._lock);
        loop->table->removeSource(loop, std::exchange(self._source, 0));
        self._loop.reset();
    }
    static ZorvaStatus getFeatureReport(ZorvaDevice *device, std::uint32_t, std::uint8_t *,
                                        std::size_t *length) noexcept {
        *length = of(device).featureLength;
        return of(device).featureStatus;
    }
    static const ZorvaValue *copyProperty(ZorvaDevice *device, const char *) noexcept {
        return of(device).property;
    }
    static ZorvaBoolean setProperty(ZorvaDevice *, const char *, const ZorvaValue *) noexcept { return 0; }
};

const ZorvaDeviceTable ProbeDevice::kTable{
    .size = sizeof(ZorvaDeviceTable),
    .retain = ProbeDevice::retain,
    .release = ProbeDevice::release,
    .open = Entries::open,
    .close = Entries::close,
    .registerInputReportCallback = Entries::registerInputReportCallback,
    .schedule = Entries::schedule,
    .unschedule = Entries::unschedule,
    .getFeatureReport = Entries::getFeatureReport,
    .copyProperty = Entries::copyProperty,
    .setProperty = Entries::setProperty,
};

void ProbeDevice::note(std::string call) {
    const std::lock_guard guard(_lock);
    _calls.push_back(std::move(call));
}

void ProbeDevice::perform(void *device) noexcept {
    const auto self = Ref<ProbeDevice>::retain(static_cast<ProbeDevice *>(device));
    for (;;) {
        Work work;
        Registration registration;
        {
            const std::lock_guard guard(self->_lock);
            if (self->_work.empty())
                return;
            work = std::move(self->_work.front());
            self->_work.pop_front();
            registration = self->_registration;
        }
        work(registration);
        const std::lock_guard guard(self->_lock);
        ++self->_workEnded;
        self->_changed.notify_all();
    }
}

void ProbeDevice::runOnInputThread(Work work) {
    std::unique_lock guard(_lock);
    _work.push_back(std::move(work));
    const std::size_t number = ++_workGiven;
    if (_source != 0)
        _loop->table->signalSource(_loop.get(), _source);
    _changed.wait(guard, [&] { return _workEnded >= number; });
}

void ProbeDevice::report(std::uint32_t type, std::uint32_t reportId, const std::uint8_t *bytes,
                         std::size_t length, std::uint64_t timestamp) {
    runOnInputThread([=, this](const Registration &registration) {
        registration.callback(registration.context, ZORVA_STATUS_SUCCESS, this, type, reportId, bytes, length,
                              timestamp);
    });
}

std::vector<std::string> ProbeDevice::calls() const {
    const std::lock_guard guard(_lock);
    return _calls;
}

ProbeDevice::Registration ProbeDevice::registration() const {
    const std::lock_guard guard(_lock);
    return _registration;
}

bool ProbeDevice::isScheduled() const {
    const std::lock_guard guard(_lock);
    return _source != 0;
}

// --- The service ---------------------------------------------------------------------------------

const ZorvaServiceTable ProbeService::kTable{
    .size = sizeof(ZorvaServiceTable),
    .retain = ProbeService::retain,
    .release = ProbeService::release,
    .createDevice = ProbeService::createDevice,
    .createEventClient = nullptr,
    .setProperty = nullptr,
};

ZorvaDevice *ProbeService::createDevice(ZorvaService *service) noexcept {
    return Ref<ZorvaDevice>::retain(of(service)._device.get()).release();
}

} // namespace ZorvaTouch::Testing
