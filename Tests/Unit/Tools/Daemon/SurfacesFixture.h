#pragma once

#include "Host/Linux/MainLoop.h"
#include "Host/Linux/UniqueFd.h"
#include "Host/Objects/EventSystem.h"
#include "Host/Runtime/SerialQueue.h"
#include "Host/Simulated/VirtualClock.h"
#include "Tests/Support/FramesScript.h"
#include "Tests/Unit/Host/Linux/FakeNode.h"
#include "Tests/Unit/Tools/Daemon/KeyboardFakes.h"
#include "Tools/Daemon/Surfaces.h"
#include "Tools/Hosting/SessionPlatform.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdint>
#include <functional>
#include <initializer_list>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

/// Surfaces on the plug-in's own file, with nothing real around them but threads.
namespace ZorvaTouch::Tools::Tests {

using std::chrono::milliseconds;
using Delays = std::vector<milliseconds>;

/// A main loop's timers for which no time passes: each runs when it is told to.
///
/// Threads: the loop's.
class ManualTimers {
public:
    explicit ManualTimers(Linux::MainLoop &loop) : _loop(loop) {}

    [[nodiscard]] Linux::LoopTimer timer();
    // Watching over the silence of a device that holds a key is a matter of its own.

    /// What is waited for, in the order in which it was asked.
    [[nodiscard]] Delays pending() const;
    /// Lets the oldest be due: one of the loop's next passes calls it.
    /// @return Becomes true when it has been called.
    std::shared_ptr<const bool> fireFirst();
    /// The same for the oldest wait for the end of a silence.
    std::shared_ptr<const bool> fireSilence();
    [[nodiscard]] bool isWatchingSilence() const { return !waits(true).empty(); }

private:
    struct Wait {
        explicit Wait(milliseconds of);
        const milliseconds delay;
        const Linux::UniqueFd due; ///< readable when the time has come
        bool isDue = false;
        const std::shared_ptr<bool> isOver = std::make_shared<bool>(false);
    };

    [[nodiscard]] std::vector<std::shared_ptr<Wait>> waits(bool forSilence) const;
    static std::shared_ptr<const bool> fire(const std::vector<std::shared_ptr<Wait>> &waits);

    Linux::MainLoop &_loop;
    mutable std::vector<std::weak_ptr<Wait>> _waits; ///< gone with their watches
};

/// Somebody who touches one sensor: reports, their frames numbered from 1 and 10 ms apart.
class TouchScript {
public:
    [[nodiscard]] Linux::Tests::Bytes image(std::initializer_list<Scripted::Touch> touches = {});

    /// Two images without a touch, and 52 of one on I and J: the last begins a hold, louder.
    [[nodiscard]] std::vector<Linux::Tests::Bytes> holdLouder();
    /// The same on B and F: the voice command.
    [[nodiscard]] std::vector<Linux::Tests::Bytes> holdPlay();
    /// One image without a touch: what is held ends.
    [[nodiscard]] std::vector<Linux::Tests::Bytes> letGo();
    /// A touch of A for 30 ms, from the first touched image to the release: play/pause.
    [[nodiscard]] std::vector<Linux::Tests::Bytes> tapPlay();

private:
    [[nodiscard]] std::vector<Linux::Tests::Bytes> hold(std::initializer_list<Scripted::Touch> touches);

    std::uint32_t _frame = 0;
};

/// The daemon's surfaces on fake nodes, a keyboard that writes down, and a main loop that runs when the test
/// says so.
class SurfacesFixture : public testing::Test {
protected:
    SurfacesFixture() : SurfacesFixture(nullptr) {}
    /// @param other  Where everything is logged instead of `logs`; null: there.
    explicit SurfacesFixture(std::shared_ptr<Ports::LogProvider> other);
    ~SurfacesFixture() override;

    /// A device as the system tells of it, "/dev/hidrawN".
    [[nodiscard]] static Linux::DeviceIdentity identity(int number, const std::string &serial,
                                                        const std::string &syspath = {});
    [[nodiscard]] Linux::Tests::FakeOpener &opener(int number);
    /// The node that was opened last; it must be open.
    [[nodiscard]] std::shared_ptr<Linux::Tests::FakeNode> node(int number);

    void send(int number, const std::vector<Linux::Tests::Bytes> &reports);
    /// Sends, and waits until so many keys more have gone down or up.
    void sendAndWait(int number, const std::vector<Linux::Tests::Bytes> &reports, std::size_t keyChanges);

    /// Serves the main loop until that is so. What does not become so in half a minute is a failure.
    void runUntil(const std::function<bool()> &isSo);
    /// Serves what has been posted, and what keys come of it.
    void settle();
    /// Serves the main loop until the surface's loss is known there, that is until it is to be tried again.
    void runUntilLost(std::size_t waiting = 1);
    /// Lets the oldest wait be over, and serves what comes of it.
    void fireFirst();
    /// Lets a second pass on a surface that holds a key.
    void fireSilence();

    const std::shared_ptr<JournalOfLogs> logs = std::make_shared<JournalOfLogs>();
    const std::shared_ptr<Ports::LogProvider> logProvider;
    Simulated::VirtualClock clock;
    SessionPlatform platform{logProvider, &clock};
    Linux::MainLoop loop;
    ManualTimers timers{loop};
    ListenerJournal told;
    FakeKeyboards keys;
    Host::SerialQueue keyQueue{"zorva-keys"};
    Keyboard keyboard{keys.maker(), told, DaemonLog(*logProvider, "Keys")};
    const std::shared_ptr<Host::EventSystem> events = Host::EventSystem::create();
    std::map<std::string, Linux::Tests::FakeOpener> openers;     ///< by node
    std::map<std::string, Ref<Linux::HidrawDevice>> lastDevices; ///< by node, if `keepsDevices`
    bool keepsDevices = false;
    /// Makes who hears of a device instead of the surface; empty: the surface itself.
    std::function<std::shared_ptr<Linux::HidrawObserver>(std::shared_ptr<Linux::HidrawObserver>)> observedBy;
    Lines came, ended; ///< the surfaces that came, and those that worked and were closed
    std::function<void()> whenEnding;
    std::function<void(const SurfaceName &, const Surface &)> whenEndingSurface;
    std::optional<Surfaces> surfaces;

private:
    [[nodiscard]] DeviceMaker makerOf(const Linux::DeviceIdentity &device);
};

} // namespace ZorvaTouch::Tools::Tests
