#pragma once

#include "Host/Runtime/AsyncWriter.h"
#include "Shared/Util/Ticks.h"
#include "Tools/Daemon/DaemonListener.h"
#include "Tools/Daemon/DaemonLog.h"

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

/// Who hears what happens in the daemon: the log, other programs, people.
namespace ZorvaTouch::Tools {

/// Tells several.
class ListenerGroup final : public DaemonListener {
public:
    explicit ListenerGroup(std::vector<std::unique_ptr<DaemonListener>> members)
        : _members(std::move(members)) {}

    void onSurface(const SurfaceName &surface, SurfaceState state, std::string_view reason) noexcept override;
    void onEvent(const SurfaceName &surface, const HostEvent &event) noexcept override;
    void onKey(const SurfaceName &surface, const HostEvent *cause, KeyChange change,
               bool isSent) noexcept override;
    void onQuarantine(const SurfaceName &surface, bool begins, std::uint64_t suppressed) noexcept override;
    void onAccelerometer(const std::string &name, bool isUsed) noexcept override;
    void onSleep(bool begins) noexcept override;
    void onRecording(const SurfaceName &surface, const std::string &file,
                     std::size_t reports) noexcept override;

private:
    const std::vector<std::unique_ptr<DaemonListener>> _members;
};

/// Tells the log what is worth a line: not gestures and keys, which are somebody's private affair, nor
/// accelerometers, of which whoever chooses them has told. A surface that cannot be opened is logged when
/// that begins and when the reason changes, not at each retry.
class LogListener final : public DaemonListener {
public:
    explicit LogListener(DaemonLog log) : _log(std::move(log)) {}

    void onSurface(const SurfaceName &surface, SurfaceState state, std::string_view reason) noexcept override;
    void onQuarantine(const SurfaceName &surface, bool begins, std::uint64_t suppressed) noexcept override;
    void onSleep(bool begins) noexcept override;
    void onRecording(const SurfaceName &surface, const std::string &file,
                     std::size_t reports) noexcept override;

private:
    void logFailure(const SurfaceName &surface, std::string_view reason) noexcept;

    const DaemonLog _log;
    std::map<std::string, std::string> _failures; ///< reasons, by the surface's identity; the main thread's
};

/// Tells other programs, by the lines of `EventLines.h`. Lines that there is no memory for are lost.
class JsonListener final : public DaemonListener {
public:
    /// @param stream, clock  Borrowed.
    JsonListener(Host::AsyncWriter &stream, Ports::Clock &clock)
        : _stream(stream), _clock(clock), _ticks(clock) {}

    void onSurface(const SurfaceName &surface, SurfaceState state, std::string_view reason) noexcept override;
    void onEvent(const SurfaceName &surface, const HostEvent &event) noexcept override;
    void onKey(const SurfaceName &surface, const HostEvent *cause, KeyChange change,
               bool isSent) noexcept override;
    void onQuarantine(const SurfaceName &surface, bool begins, std::uint64_t suppressed) noexcept override;
    void onAccelerometer(const std::string &name, bool isUsed) noexcept override;
    void onSleep(bool begins) noexcept override;
    void onRecording(const SurfaceName &surface, const std::string &file,
                     std::size_t reports) noexcept override;

private:
    template <typename News> void put(const News &news) noexcept;
    [[nodiscard]] std::uint64_t nowNs() noexcept;

    Host::AsyncWriter &_stream;
    Ports::Clock &_clock;
    const Util::TickConverter _ticks;
};

/// Shows people the keys that are not pressed, since there is no keyboard.
class ScreenListener final : public DaemonListener {
public:
    /// @param stream, clock      Borrowed. Times are shown from now on.
    /// @param showsSurface  Whether a line says which surface it is about.
    ScreenListener(Host::AsyncWriter &stream, Ports::Clock &clock, bool usesColour, bool showsSurface);

    void onKey(const SurfaceName &surface, const HostEvent *cause, KeyChange change,
               bool isSent) noexcept override;

private:
    Host::AsyncWriter &_stream;
    Ports::Clock &_clock;
    const Util::TickConverter _ticks;
    const std::uint64_t _beganTicks;
    const bool _usesColour;
    const bool _showsSurface;
    bool _hasHeading = false; ///< the key thread's
};

} // namespace ZorvaTouch::Tools
