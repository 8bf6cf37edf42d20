#include "Tools/Daemon/Listeners.h"

#include "Tools/Daemon/KeyLines.h"

#include <new>
#include <string>
#include <utility>

namespace ZorvaTouch::Tools {

// --- Several -----------------------------------------------------------------------------------------------

void ListenerGroup::onSurface(const SurfaceName &surface, SurfaceState state,
                              std::string_view reason) noexcept {
    for (const auto &member : _members)
        member->onSurface(surface, state, reason);
}

void ListenerGroup::onEvent(const SurfaceName &surface, const HostEvent &event) noexcept {
    for (const auto &member : _members)
        member->onEvent(surface, event);
}

void ListenerGroup::onKey(const SurfaceName &surface, const HostEvent *cause, KeyChange change,
                          bool isSent) noexcept {
    for (const auto &member : _members)
        member->onKey(surface, cause, change, isSent);
}

void ListenerGroup::onQuarantine(const SurfaceName &surface, bool begins, std::uint64_t suppressed) noexcept {
    for (const auto &member : _members)
        member->onQuarantine(surface, begins, suppressed);
}

void ListenerGroup::onAccelerometer(const std::string &name, bool isUsed) noexcept {
    for (const auto &member : _members)
        member->onAccelerometer(name, isUsed);
}

void ListenerGroup::onSleep(bool begins) noexcept {
    for (const auto &member : _members)
        member->onSleep(begins);
}

void ListenerGroup::onRecording(const SurfaceName &surface, const std::string &file,
                                std::size_t reports) noexcept {
    for (const auto &member : _members)
        member->onRecording(surface, file, reports);
}

// --- The log -----------------------------------------------------------------------------------------------

void LogListener::onSurface(const SurfaceName &surface, SurfaceState state,
                            std::string_view reason) noexcept {
    if (state != SurfaceState::Failed)
        _failures.erase(surface.id);
    switch (state) {
    case SurfaceState::Added:
        break; // what becomes of it comes next
    case SurfaceState::Opened:
        _log.notice({surface.node, ": gestures work (", surface.id, ")"});
        break;
    case SurfaceState::Lost: // as whenever somebody unplugs it
        _log.notice({surface.node, ": ", reason});
        break;
    case SurfaceState::Failed:
        logFailure(surface, reason);
        break;
    case SurfaceState::Removed:
        _log.notice({surface.node, ": removed (", surface.id, ")"});
        break;
    }
}

void LogListener::onQuarantine(const SurfaceName &surface, bool begins, std::uint64_t suppressed) noexcept {
    if (begins)
        _log.error(
            {surface.node,
             ": more key presses per second than --key-limit allows; its keys are not pressed until it has "
             "been quiet for 2 s"});
    else
        _log.notice({surface.node, ": its keys are pressed again; ", std::to_string(suppressed),
                     " presses were suppressed"});
}

void LogListener::logFailure(const SurfaceName &surface, std::string_view reason) noexcept {
    try {
        if (std::string &last = _failures[surface.id]; std::exchange(last, std::string(reason)) == reason)
            return;
    } catch (const std::bad_alloc &) { // rather a line too many
    }
    _log.error({surface.node, ": ", reason});
}

void LogListener::onSleep(bool begins) noexcept {
    _log.notice({begins ? "the machine goes to sleep: every key is up" : "the machine is awake"});
}

void LogListener::onRecording(const SurfaceName &surface, const std::string &file,
                              std::size_t reports) noexcept {
    _log.notice({surface.node, ": recording saved to ", file, ", ", std::to_string(reports), " reports"});
}

// --- Other programs ----------------------------------------------------------------------------------------

template <typename News> void JsonListener::put(const News &news) noexcept {
    try {
        _stream.put(lineOf(news));
    } catch (const std::bad_alloc &) { // the line is lost
    }
}

std::uint64_t JsonListener::nowNs() noexcept { return _ticks.nanosecondsFromMachTime(_clock.nowTicks()); }

void JsonListener::onSurface(const SurfaceName &surface, SurfaceState state,
                             std::string_view reason) noexcept {
    put(SurfaceNews{.state = state,
                    .surface = surface.id,
                    .node = surface.node,
                    .name = surface.name,
                    .reason = reason,
                    .timeNs = nowNs()});
}

void JsonListener::onEvent(const SurfaceName &surface, const HostEvent &event) noexcept {
    if (const auto gesture = gestureOf(event))
        put(GestureNews{.surface = surface.id,
                        .gesture = *gesture,
                        .region = regionOf(event),
                        .timeNs = _ticks.nanosecondsFromMachTime(event.timestamp())});
}

void JsonListener::onKey(const SurfaceName &surface, const HostEvent * /*cause*/, KeyChange change,
                         bool isSent) noexcept {
    put(KeyNews{.change = change, .isSent = isSent, .surface = surface.id, .timeNs = nowNs()});
}

void JsonListener::onQuarantine(const SurfaceName &surface, bool begins, std::uint64_t suppressed) noexcept {
    put(QuarantineNews{.begins = begins, .surface = surface.id, .suppressed = suppressed, .timeNs = nowNs()});
}

void JsonListener::onAccelerometer(const std::string &name, bool isUsed) noexcept {
    put(AccelerometerNews{.isUsed = isUsed, .name = name, .timeNs = nowNs()});
}

void JsonListener::onSleep(bool begins) noexcept { put(SleepNews{.begins = begins, .timeNs = nowNs()}); }

void JsonListener::onRecording(const SurfaceName &surface, const std::string &file,
                               std::size_t reports) noexcept {
    put(RecordingNews{.file = file, .surface = surface.id, .reports = reports, .timeNs = nowNs()});
}

// --- People ------------------------------------------------------------------------------------------------

ScreenListener::ScreenListener(Host::AsyncWriter &stream, Ports::Clock &clock, bool usesColour,
                               bool showsSurface)
    : _stream(stream), _clock(clock), _ticks(clock), _beganTicks(clock.nowTicks()), _usesColour(usesColour),
      _showsSurface(showsSurface) {}

void ScreenListener::onKey(const SurfaceName &surface, const HostEvent *cause, KeyChange change,
                           bool isSent) noexcept {
    if (isSent)
        return;
    ShownKey shown{.timeNs = _ticks.nanosecondsFromMachTime(_clock.nowTicks() - _beganTicks),
                   .region = kPixelRegionNone,
                   .gesture = {},
                   .change = change,
                   .surface = _showsSurface ? std::string_view(surface.id) : std::string_view()};
    if (cause) {
        shown.region = regionOf(*cause);
        shown.gesture = gestureOf(*cause);
    }
    try {
        if (!std::exchange(_hasHeading, true))
            _stream.put(keyHeading(_usesColour));
        _stream.put(keyLine(shown, _usesColour));
    } catch (const std::bad_alloc &) { // the line is lost
    }
}

} // namespace ZorvaTouch::Tools
