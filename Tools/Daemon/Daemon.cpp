#include "Tools/Daemon/Daemon.h"

#include "Host/Linux/RealTime.h"
#include "Host/Linux/StartUpCode.h"
#include "Host/Linux/TrustedFile.h"
#include "Host/Runtime/Files.h"
#include "Shared/LogNames.h"
#include "Shared/Util/Ticks.h"
#include "Tools/Daemon/DaemonChoices.h"
#include "Tools/Daemon/KeyLines.h"
#include "Tools/Daemon/PlugInLogs.h"
#include "Tools/Daemon/RecordingSaver.h"

#include <cerrno>
#include <csignal>
#include <cstring>
#include <new>
#include <stdexcept>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr int kKeyThreadPriority = 63; // as the plug-in's input threads: who hands over must not wait
constexpr int kSaveSignal = SIGUSR1;

Linux::RateLimitedLogs::Scope scopeFor(Ports::LogLevel level) {
    return level == Ports::LogLevel::Debug ? Linux::RateLimitedLogs::Scope::ExceptDebug
                                           : Linux::RateLimitedLogs::Scope::Everything;
}

std::string droppedLine(bool isJson, std::uint64_t lines) {
    return isJson ? lineOf(DroppedNews{.lines = lines}) : droppedKeyLine(lines);
}

void logOutputFailure(const DaemonLog &log, int errorNumber, std::size_t lost) noexcept {
    if (errorNumber == ECANCELED)
        log.error({"standard output: its reader hangs; lines that it does not get: ", std::to_string(lost)});
    else
        log.error({"standard output: cannot write: ", std::generic_category().message(errorNumber),
                   "; nothing is shown any more"});
}

} // namespace

// --- Putting together --------------------------------------------------------------------------------------

Daemon::Daemon(const DaemonOptions &options, DaemonSurroundings surroundings)
    : _options(options), _surroundings(std::move(surroundings)), _logs(makeLogs()),
      _platform(std::make_unique<PlugInLogs>(_logs), &_surroundings.clock), _log(*_logs, "Daemon"),
      _plugIn(loadPlugIn()),
      _stream(
          "zorva-print", _surroundings.output,
          [isJson = options.showsEvents](std::uint64_t lines) { return droppedLine(isJson, lines); },
          [log = DaemonLog(*_logs, "Events")](int errorNumber, std::size_t lost) {
              logOutputFailure(log, errorNumber, lost);
          }),
      _listener(makeListener()), _keyQueue("zorva-keys", realTimePriority()),
      _keyboard(pressesKeys(options) ? _surroundings.keyboard : nullptr, *_listener,
                DaemonLog(*_logs, "Keys")),
      _shownKeys(nullptr, *_listener, DaemonLog(*_logs, "Keys")), _events(Host::EventSystem::create()),
      _recordings(options.saveFile, options.saveLimits, *_listener, DaemonLog(*_logs, "Recordings"), _loop),
      _signals(kSignals, [this](int signal) { handleSignal(signal); }),
      _surfaces({.plugIn = _plugIn,
                 .events = _events,
                 .keyQueue = _keyQueue,
                 .keyboard = _keyboard,
                 .keyMap = options.keys,
                 .keyLimit = {.pressesPerSecond = options.keyLimit,
                              .ticks = Util::TickConverter(_surroundings.clock)},
                 .listener = *_listener,
                 .loop = _loop,
                 .log = DaemonLog(*_logs, "Surfaces"),
                 .savesSerial = options.savesSerial},
                _surroundings.finder, _surroundings.clock,
                {.onComing = [this](const SurfaceName &name) { _recordings.expect(name); },
                 .onEnding = [this](const SurfaceName &name,
                                    const Surface &surface) { _recordings.finish(name, surface); }}) {
    requireNodes(deviceFilterOf(_options));
    if (_options.saveFile) {
        Host::removeLeftovers(*_options.saveFile);
        requireSavable(_recordings.files()); // rather now than when it is too late
    }
    watchAccelerometers();
    startSimulations();
    watchDevices();
    watchSleep();
}

Daemon::~Daemon() {
    end();
    _watches.clear(); // before what they watch
}

bool Daemon::end() {
    if (std::exchange(_hasEnded, true))
        return !_recordings.hasFailed();
    _surfaces.closeAll();
    _keyQueue.drain(); // it may still be about to plug in the keyboard, which goes before it
    _recordings.wait();
    _stream.finish();
    return !_recordings.hasFailed();
}

std::shared_ptr<Linux::RateLimitedLogs> Daemon::makeLogs() {
    return std::make_shared<Linux::RateLimitedLogs>(
        _surroundings.logs, _surroundings.clock, [this] { _loop.post([this] { flushLogsWhenDue(); }); },
        scopeFor(_options.logLevel));
}

std::unique_ptr<DaemonListener> Daemon::makeListener() {
    std::vector<std::unique_ptr<DaemonListener>> listeners;
    listeners.push_back(std::make_unique<LogListener>(DaemonLog(*_logs, "Surfaces")));
    if (_options.showsEvents)
        listeners.push_back(std::make_unique<JsonListener>(_stream, _surroundings.clock));
    else
        listeners.push_back(std::make_unique<ScreenListener>(
            _stream, _surroundings.clock, _surroundings.usesColour, _options.devices.size() > 1));
    return std::make_unique<ListenerGroup>(std::move(listeners));
}

int Daemon::realTimePriority() {
    if (const auto refusal = Linux::tryRoundRobin(kKeyThreadPriority)) {
        _log.notice({refusal->line});
        _platform.forgoRealTime();
        return 0;
    }
    return kKeyThreadPriority;
}

/// Before the first surface: what is wrong with it ends the daemon at the start.
std::shared_ptr<const Host::PlugInFile> Daemon::loadPlugIn() const {
    auto plugIn = openPlugIn(Linux::trustedPath(_surroundings.plugIn));
    const HostedService service(plugIn);
    _log.notice({plugIn->path(), ", version ", service.version()});
    return plugIn;
}

// --- What it hears -----------------------------------------------------------------------------------------

/// On the signal thread, so that it works also while the main thread saves.
void Daemon::handleSignal(int signal) noexcept try {
    if (signal == kSaveSignal)
        return _loop.post([this] { save(); });
    const std::string_view name = ::sigabbrev_np(signal);
    switch (_endRequests.take(
        Util::TickConverter(_surroundings.clock).nanosecondsFromMachTime(_surroundings.clock.nowTicks()))) {
    case EndStep::Begin:
        return _loop.quit();
    case EndStep::Acknowledge:
        return _log.notice({"SIG", name,
                            ": the end is in progress; another signal within 2 s leaves out "
                            "recordings that are not saved yet"});
    case EndStep::Hurry:
        _recordings.giveUp();
        return _log.notice({"SIG", name, ": recordings that are not saved yet are left out"});
    case EndStep::Ignore:
        break;
    }
} catch (const std::bad_alloc &) {
    _log.error({"no memory to save the recording"});
}

void Daemon::save() {
    if (!_options.saveFile)
        return _log.notice({"SIGUSR1: there is no file to save the recording to; start with --save FILE"});
    _surfaces.forEach(
        [this](const SurfaceName &name, const Surface &surface) { _recordings.save(name, surface); });
}

void Daemon::watchAccelerometers() {
    if (_options.accel.choice == AccelOption::Choice::None)
        return;
    _accelHub.emplace(_events, accelChoiceOf(_options.accel),
                      _logs->openLog(kLogSubsystem, Linux::kLogCategoryAccelerometer),
                      [this] { _surfaces.reschedule(); });
    withAccelMonitor([this] {
        _accelMonitor.emplace(*_accelHub);
        _accelWatch = _loop.watch(_accelMonitor->descriptor(),
                                  [this] { withAccelMonitor([this] { _accelMonitor->receive(); }); });
        _accelMonitor->scan();
    });
    if (_options.accel.choice == AccelOption::Choice::Named && !_accelHub->chosen())
        _log.notice({"no accelerometer ", _options.accel.name, " is there yet"});
}

/// Without a monitor accelerometers are not found any more; touches go on.
void Daemon::withAccelMonitor(const std::function<void()> &use) {
    try {
        use();
    } catch (const std::system_error &error) {
        _log.error({"accelerometers are not looked for any more: ", error.what()});
        _accelWatch = {};
        _accelMonitor.reset();
    }
    noteAccelerometer();
}

void Daemon::noteAccelerometer() {
    const auto &chosen = _accelHub->chosen();
    if (chosen == _accelerometer)
        return;
    const auto nameOf = [](const Linux::AccelIdentity &accelerometer) {
        return accelerometer.name.empty() ? accelerometer.devnode : accelerometer.name;
    };
    if (_accelerometer)
        _listener->onAccelerometer(nameOf(*_accelerometer), false);
    if (chosen)
        _listener->onAccelerometer(nameOf(*chosen), true);
    _accelerometer = chosen;
}

void Daemon::watchDevices() {
    const Linux::DeviceFilter filter = deviceFilterOf(_options);
    if (filter.ids.empty() && filter.nodes.empty())
        return;
    _deviceMonitor.emplace(filter, _surfaces);
    _watches.push_back(_loop.watch(_deviceMonitor->descriptor(), [this] {
        // Early at a system's start there may be no uinput yet.
        _keyQueue.submit([this] { _keyboard.plug(); });
        _deviceMonitor->receive();
    }));
    _deviceMonitor->scan();
    logMissingDevices(filter);
}

void Daemon::logMissingDevices(const Linux::DeviceFilter &filter) {
    for (const std::string &node : filter.nodes)
        if (Linux::nodeKindOf(node) == Linux::NodeKind::Missing)
            _log.notice({node, ": does not exist yet; waiting for it"});
        else if (_surfaces.count() == 0)
            _log.notice({node, ": not ready yet; waiting for it"});
    if (filter.nodes.empty() && _surfaces.count() == 0)
        _log.notice({"no touch surface found; waiting for one"});
}

void Daemon::watchSleep() {
    _sleepWatch.emplace(
        _loop, *_logs,
        [this] {
            sleepKeyboards(true);
            _surfaces.suspend();
            _listener->onSleep(true);
        },
        [this] {
            sleepKeyboards(false);
            _listener->onSleep(false);
        });
}

void Daemon::sleepKeyboards(bool begins) {
    _keyQueue.submit([this, begins] {
        _keyboard.sleep(begins);
        _shownKeys.sleep(begins);
    });
}

void Daemon::flushLogsWhenDue() {
    _logs->flush();
    const auto due = _logs->nextDue();
    _logFlush = due ? _loop.after(*due, [this] { flushLogsWhenDue(); }) : Linux::LoopWatch();
}

// --- Simulations -------------------------------------------------------------------------------------------

void Daemon::startSimulations() {
    // A finger shakes the machine, too, unless there is a real accelerometer.
    const bool hasAccelerometer = _accelHub && !_accelerometer;
    for (const DeviceOption &device : _options.devices)
        if (const auto *const finger = std::get_if<SimulatedFinger>(&device)) {
            SimulatedSurface &simulation =
                _simulations.emplace_back(*finger, hasAccelerometer, _loop, [this] { finishSimulation(); });
            _surfaces.add(simulation.name(), simulation.maker(),
                          _options.sendsSimulatedKeys ? _keyboard : _shownKeys, simulation.events());
            simulation.play();
            ++_playing;
        }
}

/// When all have been played and nothing else is there to wait for, that was it.
void Daemon::finishSimulation() {
    if (--_playing == 0 && !_deviceMonitor)
        _loop.quit();
}

// --- Serving -----------------------------------------------------------------------------------------------

/// Two daemons would press every key twice. Surfaces that are attached later are retried instead: a daemon
/// that works does not end because another program was faster.
void Daemon::requireOwnSurfaces() const {
    const SurfaceName *const surface = _options.waits ? nullptr : _surfaces.inUse();
    if (surface)
        throw SurfaceInUse(surface->node + ": another program uses it; end that, or wait for it with --wait");
}

void Daemon::run() {
    requireOwnSurfaces();
    Linux::releaseStartUpCode(); // or it would be locked
    if (const auto refusal = Linux::lockMemory())
        _log.notice({refusal->line});
    _loop.run();
}

} // namespace ZorvaTouch::Tools
