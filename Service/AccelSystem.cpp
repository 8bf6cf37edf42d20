#include "Service/AccelSystem.h"

#include "Plugin/EventObject.h"
#include "Plugin/ObjectCheck.h"
#include "Plugin/ValueObject.h"

#include <stdexcept>
#include <utility>

namespace ZorvaTouch {
namespace {

// Where accelerometers are found among the host's services: the vendor page's accelerometer usage.
constexpr std::uint64_t kAccelUsagePage = 0xFF00;
constexpr std::uint64_t kAccelUsage = 3;

constexpr double kMicrosecondsPerSecond = 1'000'000;

} // namespace

AccelSystem::AccelSystem(const Ref<ZorvaService> &eventSystem, const ServiceLog &log, Host::RunLoop *runLoop,
                         const char *mode, std::uint32_t rateHz, EventHandler eventHandler)
    : _log(log), _eventHandler(std::move(eventHandler)) {
    if (!runLoop || !mode || !_eventHandler)
        return;
    _mode = mode;
    createClient(eventSystem);
    setMatching();
    takeFirstService();
    setReportInterval(rateHz);
    _client->table->registerCallback(_client.get(), handleEvent, this);
    _client->table->schedule(_client.get(), runLoop->boundary(), _mode.c_str());
    _runLoop = runLoop;
}

void AccelSystem::createClient(const Ref<ZorvaService> &eventSystem) {
    const auto create =
        eventSystem ? entryOf(*eventSystem->table, &ZorvaServiceTable::createEventClient) : nullptr;
    if (create) {
        ZorvaEventClient *const client = create(eventSystem.get(), ZORVA_EVENT_CLIENT_MONITOR);
        if (isComplete(client))
            _client = Ref<ZorvaEventClient>::adopt(client);
    }
    if (!_client)
        throw std::runtime_error("createEventClient returned nil");
}

void AccelSystem::setMatching() {
    const auto matching = makeValue(
        PropertyValue::Dictionary{{"PrimaryUsagePage", kAccelUsagePage}, {"PrimaryUsage", kAccelUsage}});
    _client->table->setMatching(_client.get(), matching.get());
}

void AccelSystem::takeFirstService() {
    ZorvaService *service = nullptr;
    if (_client->table->copyServices(_client.get(), &service, 1) > 0 && isComplete(service))
        _service = Ref<ZorvaService>::adopt(service);
    if (!_service)
        throw std::runtime_error("copyServices returned empty array");
}

void AccelSystem::setReportInterval(std::uint32_t rateHz) {
    const auto setProperty = entryOf(*_service->table, &ZorvaServiceTable::setProperty);
    if (!setProperty)
        return;
    const auto interval = makeValue(1.0 / rateHz * kMicrosecondsPerSecond);
    setProperty(_service.get(), "ReportInterval", interval.get());
}

void AccelSystem::handleEvent(void *context, const ZorvaEvent *event) noexcept {
    const AccelSystem &self = *static_cast<AccelSystem *>(context);
    runGuarded(self._log, "accelerometer event", [&] {
        const std::shared_ptr<HostEvent> read = readEvent(event);
        if (read && read->accelerometer())
            self._eventHandler(*read);
    });
}

void AccelSystem::cleanup() noexcept {
    Host::RunLoop *const runLoop = std::exchange(_runLoop, nullptr);
    if (!runLoop)
        return;
    _client->table->unschedule(_client.get(), runLoop->boundary(), _mode.c_str());
    _client->table->unregisterCallback(_client.get(), handleEvent, this);
}

} // namespace ZorvaTouch
