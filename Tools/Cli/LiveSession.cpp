#include "Tools/Cli/LiveSession.h"

#include "Host/Simulated/Player.h"
#include "Shared/Util/Ticks.h"
#include "Tools/Hosting/ScreenLogs.h"

#include <array>
#include <chrono>
#include <cmath>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::chrono::milliseconds kLongestSilence{40}; // between two looks at the time
constexpr const char *kQueueThreadName = "zorva-queue";
constexpr const char *kPipelineDomain = "Pipeline.";
/// What a device says of itself and nobody changes.
constexpr std::array<const char *, 4> kIdentityKeys{"Product", "SerialNumber", "VendorID", "ProductID"};

std::uint64_t nanoseconds(std::uint64_t ticks, Ports::Clock &clock) {
    return Util::TickConverter(clock).nanosecondsFromMachTime(ticks);
}

} // namespace

LiveSession::LiveSession(const LiveOptions &options, EventInbox &inbox, Environment &environment)
    : _options(options), _platform(openLogs(environment), isVirtual() ? &_virtualClock : nullptr),
      _inbox(inbox), _events(Host::EventSystem::create()),
      _accelerometer(Host::Accelerometer::create(_events)), _device(Simulated::Device::create()),
      _offered(Host::Service::create(_device, _events)), _queue(kQueueThreadName) {
    for (const char *const key : kIdentityKeys)
        _device->properties().makeReadOnly(key);
    _service.emplace(openPlugIn(options.plugIn));
}

LiveSession::~LiveSession() {
    end();
    _service.reset();
}

void LiveSession::start(std::uint64_t startNs) {
    _virtualClock.advanceToNanoseconds(startNs);
    _service->start(_offered.get());
    _service->setEventCallback(EventInbox::receive, &_inbox);
}

void LiveSession::play(LiveSource source, LiveListener &listener) {
    _service->schedule(_queue.boundary());
    _platform.waitUntilServing(); // or the first reports would come before the device is scheduled
    _startNs = nowNs();
    if (isVirtual())
        playInLockStep(std::move(source), listener);
    else
        playAtPace(std::move(source), listener);
    _device->waitUntilHandled();
    end();
    hear(listener);
}

void LiveSession::playInLockStep(LiveSource source, LiveListener &listener) {
    // Asking for a frame means that the one before has been handled.
    const auto nextFrame = [&]() -> std::optional<Frame> {
        _queue.drain();
        hear(listener);
        return _inbox.isStopped() ? std::nullopt : source.frames();
    };
    Simulated::Player(nextFrame, playerOutput()).playAll(_virtualClock);
}

void LiveSession::playAtPace(LiveSource source, LiveListener &listener) {
    const auto nextFrame = [&]() -> std::optional<Frame> {
        try {
            std::optional<Frame> frame = source.frames();
            if (!frame)
                _inbox.finish();
            return frame;
        } catch (...) { // told below
            _inbox.finish();
            throw;
        }
    };
    Simulated::Player player(nextFrame, playerOutput());
    player.start(_platform, static_cast<double>(_options.speed));
    while (_inbox.waitFor(kLongestSilence))
        hear(listener);
    player.stop();
    player.waitUntilFinished();
}

Simulated::PlayerOutput LiveSession::playerOutput() {
    return {.device = _device,
            .accelerometer = _accelerometer,
            .onReport =
                [this](const Frame &frame) {
                    if (const auto image = InputReport::Image::parse(frame.data.data(), frame.data.size()))
                        _inbox.putImage(*image);
                },
            .onMetadata = nullptr,
            .onState = [this](const Frame &frame) { setState(frame); }};
}

/// A recording's own writes are the host's to make again.
void LiveSession::setState(const Frame &frame) {
    static_cast<void>(_service->setProperty(kPipelineDomain + frame.key, frame.value));
}

/// On a screen the log waits until there is room for its lines.
std::unique_ptr<Ports::LogProvider> LiveSession::openLogs(Environment &environment) {
    std::unique_ptr<Ports::LogProvider> logs = environment.openLogs(_options.logLevel);
    if (_options.logLevel != Ports::LogLevel::Debug)
        logs = std::make_unique<ScreenLogs>(std::move(logs));
    if (environment.screenColumns() == 0)
        return logs;
    auto deferred = std::make_unique<DeferredLogs>(std::move(logs));
    _deferredLogs = deferred.get();
    return deferred;
}

void LiveSession::hear(LiveListener &listener) {
    if (_deferredLogs && _deferredLogs->hasRecords()) {
        listener.makeRoomForLog();
        _deferredLogs->write();
    }
    const std::uint64_t timeNs = sinceStart(nowNs());
    for (const auto &event : _inbox.takeEvents())
        listener.heard(*event, sinceStart(nanoseconds(event->timestamp(), _platform.clock())));
    listener.passed(timeNs, _inbox.latestImage());
}

bool LiveSession::isVirtual() const noexcept { return std::isinf(_options.speed); }

std::uint64_t LiveSession::nowNs() noexcept {
    return nanoseconds(_platform.clock().nowTicks(), _platform.clock());
}

std::uint64_t LiveSession::sinceStart(std::uint64_t timeNs) const noexcept {
    return timeNs < _startNs ? 0 : timeNs - _startNs;
}

void LiveSession::end() noexcept {
    _service->unschedule();
    _queue.drain(); // whatever runs there belongs to the plug-in
}

} // namespace ZorvaTouch::Tools
