#pragma once

#include "Shared/Ports/Log.h"
#include "Tools/Daemon/DaemonListener.h"
#include "Tools/Daemon/Keyboard.h"

#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <set>
#include <string>
#include <string_view>
#include <vector>

/// What the daemon's parts talk to, in tests: a keyboard, a listener and a log that write down what they
/// hear.
namespace ZorvaTouch::Tools::Tests {

using Lines = std::vector<std::string>;

/// Lines of several threads, and whoever waits for them.
///
/// Threads: any.
class LineJournal {
public:
    void add(std::string line);
    [[nodiscard]] Lines lines() const;
    [[nodiscard]] std::size_t size() const;
    /// What came since the last time.
    [[nodiscard]] Lines take();
    /// Waits until there are so many. What does not come in half a minute is a failure, here and below.
    void waitFor(std::size_t count);
    /// Waits until so many lines contain this.
    void waitFor(std::string_view part, std::size_t count);
    /// How many lines contain this.
    [[nodiscard]] std::size_t count(std::string_view part) const;

private:
    /// Under the lock.
    [[nodiscard]] std::size_t countLocked(std::string_view part) const;

    mutable std::mutex _mutex;
    std::condition_variable _changed;
    Lines _lines;
    std::size_t _taken = 0;
};

/// Keyboards that are made one after the other, as the system sees them: "1 plugged", "1 +115", "1 -115",
/// "1 unplugged". What fails is "1 +115 failed", and leaves the key as it was.
///
/// Threads: any, but for what is set.
class FakeKeyboards {
public:
    [[nodiscard]] KeyboardMaker maker();

    /// The keys that are down, on any keyboard. One that is unplugged lets go of its keys.
    [[nodiscard]] std::set<KeyCode> down() const;

    LineJournal journal;
    std::deque<int> pressErrors, releaseErrors; ///< what the next ones fail with; 0: not at all
    std::deque<std::string> makerErrors;        ///< why there is no keyboard the next times; empty: there is
    std::function<void(KeyCode)> onPress;       ///< called by whoever presses, when the key is down

private:
    class Output;

    mutable std::mutex _mutex;
    std::set<KeyCode> _down;
    int _count = 0;
};

/// Writes down what it hears: "added SN1", "failed SN1: open: Permission denied", "SN1 tap volume-up", "SN1
/// +115", "SN1 +115 shown", and with the event that it is the doing of "SN1 +115 by hold-start".
///
/// Threads: any.
class ListenerJournal final : public DaemonListener {
public:
    LineJournal surfaces, events, keys, others;

    void onSurface(const SurfaceName &surface, SurfaceState state, std::string_view reason) noexcept override;
    void onEvent(const SurfaceName &surface, const HostEvent &event) noexcept override;
    void onKey(const SurfaceName &surface, const HostEvent *cause, KeyChange change,
               bool isSent) noexcept override;
    void onQuarantine(const SurfaceName &surface, bool begins, std::uint64_t suppressed) noexcept override;
    void onAccelerometer(const std::string &name, bool isUsed) noexcept override;
    void onSleep(bool begins) noexcept override;
    void onRecording(const SurfaceName &surface, const std::string &file,
                     std::size_t reports) noexcept override;
};

/// Logs whose records are lines: "Surfaces error: text". Those of the level debug are written only if they
/// begin with a text that the test asks for.
///
/// Threads: any.
class JournalOfLogs final : public Ports::LogProvider {
public:
    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;
    [[nodiscard]] LineJournal &lines() noexcept { return *_lines; }

    std::string debugPrefix; ///< of the records of level debug that are wanted, for handles that are opened
                             ///< from now on

private:
    class Handle;
    const std::shared_ptr<LineJournal> _lines =
        std::make_shared<LineJournal>(); ///< handles may outlive the rest
};

/// An event as the plug-in makes it.
[[nodiscard]] std::shared_ptr<HostEvent> gestureEvent(Gesture gesture, PixelRegion region,
                                                      std::uint64_t timestamp = 0);

/// A key that goes down or up, as "+115" or "-115".
[[nodiscard]] std::string textOf(KeyChange change);

} // namespace ZorvaTouch::Tools::Tests
