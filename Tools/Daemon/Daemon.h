#pragma once

#include "Host/Linux/AccelHub.h"
#include "Host/Linux/AccelMonitor.h"
#include "Host/Linux/DeviceMonitor.h"
#include "Host/Linux/MainLoop.h"
#include "Host/Linux/RateLimitedLogs.h"
#include "Host/Linux/SleepWatch.h"
#include "Host/Objects/EventSystem.h"
#include "Host/Runtime/AsyncWriter.h"
#include "Host/Runtime/SerialQueue.h"
#include "Host/Runtime/SignalWatch.h"
#include "Host/Runtime/StreamWriter.h"
#include "Tools/Daemon/DaemonOptions.h"
#include "Tools/Daemon/EndRequests.h"
#include "Tools/Daemon/Listeners.h"
#include "Tools/Daemon/RecordingKeeper.h"
#include "Tools/Daemon/SimulatedSurface.h"
#include "Tools/Daemon/Surfaces.h"
#include "Tools/Hosting/SessionPlatform.h"

#include <array>
#include <csignal>
#include <functional>
#include <list>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {

/// What the daemon has around it. Tests hand in doubles.
struct DaemonSurroundings {
    std::string plugIn;                       ///< the file
    Ports::LogProvider &logs;                 ///< borrowed
    Ports::Clock &clock;                      ///< borrowed
    std::shared_ptr<Host::TextWriter> output; ///< standard output
    bool usesColour = false;                  ///< standard output is a terminal that shows colours
    KeyboardMaker keyboard;                   ///< empty: keys are shown
    DeviceFinder finder;                      ///< makes the devices that the system tells of
};

/// The driver: from the surfaces that are there to the keys of one keyboard. It puts the parts together and
/// lets them hear of each other; what each does is its own affair.
///
/// It ends when it receives SIGTERM, SIGINT, SIGHUP, or another signal that ends programs by default and may
/// come from outside (`EndRequests.h` describes further ones). SIGUSR1 saves recordings.
///
/// Threads: the one that makes it, which becomes the main thread, and those of its parts.
class Daemon {
public:
    /// What it receives. They stay blocked only as long as the daemon exists; a program blocks them for good
    /// before its first thread, so that a signal during the end does not kill it.
    static constexpr std::array kSignals{SIGTERM, SIGINT, SIGHUP, SIGQUIT, SIGALRM, SIGUSR1, SIGUSR2};

    /// @param options, surroundings  The first is borrowed.
    /// @throws std::runtime_error  It cannot work at all, with the reason in one line.
    Daemon(const DaemonOptions &options, DaemonSurroundings surroundings);
    /// Ends, if that has not happened yet.
    ~Daemon();
    Daemon(const Daemon &) = delete;
    Daemon &operator=(const Daemon &) = delete;

    /// Serves until a signal, or until all that was simulated has been played.
    /// @throws SurfaceInUse  Another program uses one of the surfaces that were there at the start, and the
    ///                       options do not say to wait for it.
    /// @throws std::runtime_error
    void run();

    /// Lets every key go up, and then waits until recordings that are wanted are saved. Once.
    /// @return Whether they all were.
    bool end();
    /// Whether saving was given up and the system has not let a write end: the destructor waits until it
    /// does.
    [[nodiscard]] bool isStuck() const { return _hasEnded && _recordings.isBusy(); }

private:
    [[nodiscard]] std::shared_ptr<const Host::PlugInFile> loadPlugIn() const;
    [[nodiscard]] std::unique_ptr<DaemonListener> makeListener();
    [[nodiscard]] std::shared_ptr<Linux::RateLimitedLogs> makeLogs();
    /// Of the key thread, 0 if none is allowed.
    [[nodiscard]] int realTimePriority();

    void handleSignal(int signal) noexcept;
    void save();
    void watchAccelerometers();
    void startSimulations();
    void watchDevices();
    void requireOwnSurfaces() const;
    void logMissingDevices(const Linux::DeviceFilter &filter);
    void watchSleep();
    void sleepKeyboards(bool begins);

    void withAccelMonitor(const std::function<void()> &use);
    void noteAccelerometer();
    void flushLogsWhenDue();
    void finishSimulation();

    const DaemonOptions &_options;
    const DaemonSurroundings _surroundings;

    Linux::MainLoop _loop;
    std::vector<Linux::LoopWatch> _watches; ///< for as long as the daemon lives
    Linux::LoopWatch _logFlush;
    const std::shared_ptr<Linux::RateLimitedLogs> _logs;
    SessionPlatform _platform;
    const DaemonLog _log;
    const std::shared_ptr<const Host::PlugInFile>
        _plugIn; ///< the same for every surface, as long as it lives
    Host::AsyncWriter _stream;
    const std::unique_ptr<DaemonListener> _listener;
    Host::SerialQueue _keyQueue;
    Keyboard _keyboard;
    Keyboard _shownKeys; ///< of surfaces whose keys are only shown
    const std::shared_ptr<Host::EventSystem> _events;
    RecordingKeeper _recordings;
    EndRequests _endRequests; ///< the signal thread's
    Host::SignalWatch _signals;
    bool _hasEnded = false;
    Surfaces _surfaces;
    std::optional<Linux::AccelHub> _accelHub;
    std::optional<Linux::AccelIdentity> _accelerometer; ///< the one that is used
    std::optional<Linux::AccelMonitor> _accelMonitor;
    Linux::LoopWatch _accelWatch;
    std::list<SimulatedSurface> _simulations;
    std::size_t _playing = 0; ///< of the simulations
    std::optional<Linux::DeviceMonitor> _deviceMonitor;
    std::optional<Linux::SleepWatch> _sleepWatch;
};

} // namespace ZorvaTouch::Tools
