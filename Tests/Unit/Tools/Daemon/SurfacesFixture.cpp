#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include <sys/eventfd.h>
#include <systemd/sd-event.h>
#include <unistd.h>

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Tools::Tests {

using Linux::Tests::Bytes;
using Linux::Tests::FakeNode;
using Linux::Tests::FakeOpener;

namespace {

constexpr std::uint64_t kLongUs = 30'000'000; ///< only as long as something is wrong
constexpr std::uint32_t kFrameMs = 10;
constexpr int kHoldFrames = 52; ///< the time-out of 500 ms, and one

} // namespace

// --- Timers ------------------------------------------------------------------------------------------------

ManualTimers::Wait::Wait(milliseconds of) : delay(of), due(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {}

Linux::LoopTimer ManualTimers::timer() {
    return [this](std::chrono::microseconds delay, std::function<void()> function) {
        const auto wait = std::make_shared<Wait>(std::chrono::duration_cast<milliseconds>(delay));
        _waits.push_back(wait);
        const int descriptor = wait->due.get();
        return _loop.watch(descriptor, [wait, function = std::move(function)] {
            std::uint64_t count = 0;
            if (::read(wait->due.get(), &count, sizeof count) != sizeof count)
                return;
            function();
            *wait->isOver = true;
        });
    };
}

std::vector<std::shared_ptr<ManualTimers::Wait>> ManualTimers::waits(bool forSilence) const {
    std::erase_if(_waits, [](const std::weak_ptr<Wait> &wait) { return wait.expired(); });
    std::vector<std::shared_ptr<Wait>> all;
    for (const auto &entry : _waits)
        if (auto wait = entry.lock();
            wait && !wait->isDue && (wait->delay == Surface::kLongestSilence) == forSilence)
            all.push_back(std::move(wait));
    return all;
}

Delays ManualTimers::pending() const {
    Delays delays;
    for (const auto &wait : waits(false))
        delays.push_back(wait->delay);
    return delays;
}

std::shared_ptr<const bool> ManualTimers::fireFirst() { return fire(waits(false)); }

std::shared_ptr<const bool> ManualTimers::fireSilence() { return fire(waits(true)); }

std::shared_ptr<const bool> ManualTimers::fire(const std::vector<std::shared_ptr<Wait>> &all) {
    EXPECT_FALSE(all.empty()) << "nothing is waited for";
    if (all.empty())
        return std::make_shared<bool>(true);
    all.front()->isDue = true;
    const std::uint64_t one = 1;
    EXPECT_EQ(::write(all.front()->due.get(), &one, sizeof one), ssize_t{sizeof one});
    return all.front()->isOver;
}

// --- A finger ----------------------------------------------------------------------------------------------

Bytes TouchScript::image(std::initializer_list<Scripted::Touch> touches) {
    const std::uint32_t frame = ++_frame;
    return Scripted::imageReport(frame, frame * kFrameMs, Scripted::electrodes(touches));
}

std::vector<Bytes> TouchScript::hold(std::initializer_list<Scripted::Touch> touches) {
    std::vector<Bytes> reports{image(), image()};
    for (int i = 0; i < kHoldFrames; ++i)
        reports.push_back(image(touches));
    return reports;
}

std::vector<Bytes> TouchScript::holdLouder() { return hold({{'I', 260}, {'J', 220}}); }
std::vector<Bytes> TouchScript::holdPlay() { return hold({{'B', 260}, {'F', 200}}); }
std::vector<Bytes> TouchScript::letGo() { return {image()}; }

std::vector<Bytes> TouchScript::tapPlay() {
    std::vector<Bytes> reports{image(), image()};
    for (int i = 0; i < 3; ++i)
        reports.push_back(image({{'A', 300}}));
    reports.push_back(image());
    return reports;
}

// --- Surfaces ----------------------------------------------------------------------------------------------

SurfacesFixture::SurfacesFixture(std::shared_ptr<Ports::LogProvider> other)
    : logProvider(other ? std::move(other) : logs) {
    keyQueue.drain(); // its thread runs, for whose start a sanitizer opens a descriptor
    surfaces.emplace(
        SurfaceSurroundings{.plugIn = openPlugIn(ZORVA_TEST_PLUGIN),
                            .events = events,
                            .keyQueue = keyQueue,
                            .keyboard = keyboard,
                            .keyMap = KeyMap(),
                            .listener = told,
                            .loop = loop,
                            .log = DaemonLog(*logProvider, "Surfaces"),
                            .after = timers.timer()},
        [this](const Linux::DeviceIdentity &device) { return makerOf(device); }, clock,
        SurfaceHooks{.onComing = [this](const SurfaceName &name) { came.push_back(name.id); },
                     .onEnding =
                         [this](const SurfaceName &name, const Surface &surface) {
                             ended.push_back(name.id);
                             if (whenEndingSurface)
                                 whenEndingSurface(name, surface);
                             if (whenEnding)
                                 whenEnding();
                         }});
}

SurfacesFixture::~SurfacesFixture() {
    surfaces.reset();
    keyQueue.drain();
    EXPECT_TRUE(keys.down().empty()) << "a key is down in the end";
}

Linux::DeviceIdentity SurfacesFixture::identity(int number, const std::string &serial,
                                                const std::string &syspath) {
    const std::string name = "hidraw" + std::to_string(number);
    return {.devnode = "/dev/" + name,
            .syspath = syspath.empty() ? "/sys/" + name : syspath,
            .hidSyspath = "/sys/hid" + std::to_string(number),
            .id = {0x1234, 0xABCD},
            .serial = serial,
            .physicalPath = "usb-" + std::to_string(number),
            .name = "Touch"};
}

FakeOpener &SurfacesFixture::opener(int number) { return openers["/dev/hidraw" + std::to_string(number)]; }

std::shared_ptr<FakeNode> SurfacesFixture::node(int number) {
    auto found = opener(number).node();
    EXPECT_NE(found, nullptr) << "/dev/hidraw" << number << " is not open";
    return found;
}

DeviceMaker SurfacesFixture::makerOf(const Linux::DeviceIdentity &device) {
    return [this, devnode = device.devnode](const std::shared_ptr<Linux::HidrawObserver> &observer) {
        auto made = Linux::HidrawDevice::create(openers[devnode].opener(),
                                                observedBy ? observedBy(observer) : observer);
        if (keepsDevices)
            lastDevices[devnode] = made;
        return Ref<ZorvaDevice>(std::move(made));
    };
}

void SurfacesFixture::send(int number, const std::vector<Bytes> &reports) {
    const auto to = node(number);
    for (const Bytes &report : reports)
        to->send(report);
}

void SurfacesFixture::sendAndWait(int number, const std::vector<Bytes> &reports, std::size_t keyChanges) {
    const std::size_t before = told.keys.size();
    send(number, reports);
    told.keys.waitFor(before + keyChanges);
}

void SurfacesFixture::runUntil(const std::function<bool()> &isSo) {
    while (!isSo())
        if (const int served = ::sd_event_run(loop.native(), kLongUs); served <= 0) {
            ADD_FAILURE() << "nothing happens, " << served;
            return;
        }
}

void SurfacesFixture::settle() {
    bool isServed = false;
    loop.post([&] { isServed = true; });
    runUntil([&] { return isServed; });
    keyQueue.drain();
}

void SurfacesFixture::runUntilLost(std::size_t waiting) {
    runUntil([&] { return timers.pending().size() >= waiting; });
    keyQueue.drain();
}

void SurfacesFixture::fireSilence() {
    runUntil([&] { return timers.isWatchingSilence(); });
    const auto isOver = timers.fireSilence();
    runUntil([&] { return *isOver; });
    keyQueue.drain();
}

void SurfacesFixture::fireFirst() {
    const auto isOver = timers.fireFirst();
    runUntil([&] { return *isOver; });
}

} // namespace ZorvaTouch::Tools::Tests
