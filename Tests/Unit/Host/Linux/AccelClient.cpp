#include "Tests/Unit/Host/Linux/AccelClient.h"

#include "Plugin/EventObject.h"
#include "Plugin/ValueObject.h"

#include <sstream>

namespace ZorvaTouch::Linux::Tests {
namespace {

const PropertyValue::Dictionary kAccelerometers{{"PrimaryUsagePage", 0xFF00u}, {"PrimaryUsage", 3u}};

} // namespace

AccelClient::AccelClient(const std::shared_ptr<Host::EventSystem> &system, Story &story,
                         std::optional<double> intervalUs)
    : _story(story), _client(system->createClient()) {
    _thread.emplace([this, intervalUs](ZorvaRunLoop *loop) { begin(loop, intervalUs); },
                    [this](ZorvaRunLoop *loop) { end(loop); });
}

AccelClient::~AccelClient() = default;

void AccelClient::begin(ZorvaRunLoop *loop, std::optional<double> intervalUs) {
    _idleSource = loop->table->addSource(
        loop, "mode", [](void *) {}, nullptr);
    _client->table->setMatching(_client.get(), makeValue(kAccelerometers).get());
    if (intervalUs)
        setInterval(*intervalUs);
    _client->table->registerCallback(_client.get(), hear, this);
    _client->table->schedule(_client.get(), loop, "mode");
}

void AccelClient::end(ZorvaRunLoop *loop) {
    _client->table->unschedule(_client.get(), loop, "mode");
    loop->table->removeSource(loop, _idleSource);
}

void AccelClient::setInterval(double intervalUs) {
    ZorvaService *first = nullptr;
    _client->table->copyServices(_client.get(), &first, 1);
    const auto service = Ref<ZorvaService>::adopt(first);
    service->table->setProperty(service.get(), "ReportInterval", makeValue(intervalUs).get());
}

std::size_t AccelClient::matchCount() { return _client->table->copyServices(_client.get(), nullptr, 0); }

void AccelClient::hear(void *context, const ZorvaEvent *event) noexcept {
    auto &self = *static_cast<AccelClient *>(context);
    const auto read = readEvent(event);
    const AccelerometerFields &fields = *read->accelerometer();
    std::ostringstream line;
    line << fields.x << ' ' << fields.y << ' ' << fields.z << " at " << read->timestamp();
    self._lastTimestamp = read->timestamp();
    self._story.add(line.str());
}

} // namespace ZorvaTouch::Linux::Tests
