#include "Tests/Unit/Tools/Daemon/KeyboardFakes.h"

#include "Tools/Stimulus/EventNames.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch::Tools::Tests {
namespace {

/// Only as long as something is wrong. By the clock whose waits the thread sanitizer knows.
std::chrono::system_clock::time_point giveUpAt() {
    return std::chrono::system_clock::now() + std::chrono::seconds(30);
}

int takeError(std::deque<int> &errors) {
    if (errors.empty())
        return 0;
    const int error = errors.front();
    errors.pop_front();
    return error;
}

std::string gestureText(const HostEvent &event) {
    const auto gesture = gestureOf(event);
    return gesture ? std::string(nameOf(*gesture)) : "no gesture";
}

} // namespace

// --- Lines -------------------------------------------------------------------------------------------------

void LineJournal::add(std::string line) {
    const std::lock_guard lock(_mutex);
    _lines.push_back(std::move(line));
    _changed.notify_all();
}

Lines LineJournal::lines() const {
    const std::lock_guard lock(_mutex);
    return _lines;
}

std::size_t LineJournal::size() const {
    const std::lock_guard lock(_mutex);
    return _lines.size();
}

Lines LineJournal::take() {
    const std::lock_guard lock(_mutex);
    Lines taken(_lines.begin() + static_cast<std::ptrdiff_t>(_taken), _lines.end());
    _taken = _lines.size();
    return taken;
}

void LineJournal::waitFor(std::size_t count) {
    std::unique_lock lock(_mutex);
    EXPECT_TRUE(_changed.wait_until(lock, giveUpAt(), [&] { return _lines.size() >= count; }))
        << "waited for " << count << " lines, and there are " << _lines.size();
}

void LineJournal::waitFor(std::string_view part, std::size_t count) {
    std::unique_lock lock(_mutex);
    EXPECT_TRUE(_changed.wait_until(lock, giveUpAt(), [&] { return countLocked(part) >= count; }))
        << "waited for " << count << " lines with " << part;
}

std::size_t LineJournal::count(std::string_view part) const {
    const std::lock_guard lock(_mutex);
    return countLocked(part);
}

std::size_t LineJournal::countLocked(std::string_view part) const {
    return static_cast<std::size_t>(std::ranges::count_if(
        _lines, [part](const std::string &line) { return line.find(part) != std::string::npos; }));
}

// --- Keyboards ---------------------------------------------------------------------------------------------

class FakeKeyboards::Output final : public Linux::KeyOutput {
public:
    Output(FakeKeyboards &all, int number) : _all(all), _prefix(std::to_string(number) + " ") {
        _all.journal.add(_prefix + "plugged");
    }
    ~Output() override {
        for (const KeyCode code : _down)
            note(code, false);
        _all.journal.add(_prefix + "unplugged");
    }
    Output(const Output &) = delete;
    Output &operator=(const Output &) = delete;

    std::optional<Linux::SystemFailure> press(std::uint16_t code) noexcept override {
        return set({code, true}, _all.pressErrors);
    }
    std::optional<Linux::SystemFailure> release(std::uint16_t code) noexcept override {
        return set({code, false}, _all.releaseErrors);
    }

private:
    std::optional<Linux::SystemFailure> set(KeyChange change, std::deque<int> &errors) {
        if (const int error = takeError(errors)) {
            _all.journal.add(_prefix + textOf(change) + " failed");
            return Linux::SystemFailure{"write", error};
        }
        note(change.code, change.isPressed);
        if (change.isPressed)
            _down.insert(change.code);
        else
            _down.erase(change.code);
        _all.journal.add(_prefix + textOf(change));
        if (change.isPressed && _all.onPress)
            _all.onPress(change.code);
        return std::nullopt;
    }

    void note(KeyCode code, bool isDown) {
        const std::lock_guard lock(_all._mutex);
        if (isDown)
            _all._down.insert(code);
        else
            _all._down.erase(code);
    }

    FakeKeyboards &_all;
    const std::string _prefix;
    std::set<KeyCode> _down;
};

KeyboardMaker FakeKeyboards::maker() {
    return [this]() -> std::unique_ptr<Linux::KeyOutput> {
        if (!makerErrors.empty()) {
            const std::string error = makerErrors.front();
            makerErrors.pop_front();
            if (!error.empty())
                throw std::runtime_error(error);
        }
        return std::make_unique<Output>(*this, ++_count);
    };
}

std::set<KeyCode> FakeKeyboards::down() const {
    const std::lock_guard lock(_mutex);
    return _down;
}

// --- A listener --------------------------------------------------------------------------------------------

void ListenerJournal::onSurface(const SurfaceName &surface, SurfaceState state,
                                std::string_view reason) noexcept {
    static constexpr std::array kNames{"added ", "opened ", "lost ", "failed ", "removed "};
    std::string line = kNames[static_cast<std::size_t>(state)] + surface.id;
    surfaces.add(reason.empty() ? std::move(line) : line.append(": ").append(reason));
}

void ListenerJournal::onEvent(const SurfaceName &surface, const HostEvent &event) noexcept {
    events.add(surface.id + " " + gestureText(event) + " " + std::string(nameOf(regionOf(event))));
}

void ListenerJournal::onKey(const SurfaceName &surface, const HostEvent *cause, KeyChange change,
                            bool isSent) noexcept {
    keys.add(surface.id + " " + textOf(change) + (isSent ? "" : " shown") +
             (cause ? " by " + gestureText(*cause) : ""));
}

void ListenerJournal::onQuarantine(const SurfaceName &surface, bool begins,
                                   std::uint64_t suppressed) noexcept {
    others.add("quarantine of " + surface.id + (begins ? " begins " : " ends ") + std::to_string(suppressed));
}

void ListenerJournal::onAccelerometer(const std::string &name, bool isUsed) noexcept {
    others.add("accelerometer " + name + (isUsed ? " used" : " gone"));
}

void ListenerJournal::onSleep(bool begins) noexcept { others.add(begins ? "sleep" : "awake"); }

void ListenerJournal::onRecording(const SurfaceName &surface, const std::string &file,
                                  std::size_t reports) noexcept {
    others.add("recording " + surface.id + " " + file + " " + std::to_string(reports));
}

// --- Logs --------------------------------------------------------------------------------------------------

class JournalOfLogs::Handle final : public Ports::Log {
public:
    Handle(std::shared_ptr<LineJournal> lines, std::string_view category, std::string debugPrefix)
        : _lines(std::move(lines)), _category(category), _debugPrefix(std::move(debugPrefix)) {}

    [[nodiscard]] bool isEnabled(Ports::LogLevel level) const noexcept override {
        return level != Ports::LogLevel::Debug || !_debugPrefix.empty();
    }
    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        if (level != Ports::LogLevel::Debug || text.starts_with(_debugPrefix))
            _lines->add(_category + (level == Ports::LogLevel::Error ? " error: " : ": ") +
                        std::string(text));
    }

private:
    const std::shared_ptr<LineJournal> _lines;
    const std::string _category;
    const std::string _debugPrefix;
};

std::shared_ptr<Ports::Log> JournalOfLogs::openLog(std::string_view /*subsystem*/,
                                                   std::string_view category) {
    return std::make_shared<Handle>(_lines, category, debugPrefix);
}

// --- Events ------------------------------------------------------------------------------------------------

std::shared_ptr<HostEvent> gestureEvent(Gesture gesture, PixelRegion region, std::uint64_t timestamp) {
    if (gesture == Gesture::Reset)
        return HostEvent::createVendorDefined(timestamp, {.usagePage = 0xFF60, .usage = 2, .payload = {}}, 0);
    struct Code {
        std::uint32_t mask;
        std::uint16_t phase;
    };
    static constexpr std::array<Code, 6> kCodes{{{0, 128}, {2, 1}, {2, 2}, {2, 4}, {0x20000, 0}, {0, 8}}};
    const Code code = kCodes[static_cast<std::size_t>(gesture)];
    auto event =
        HostEvent::createDigitizer(timestamp, {.eventMask = code.mask, .y = static_cast<double>(region)}, 0);
    event->setPhase(code.phase);
    return event;
}

std::string textOf(KeyChange change) { return (change.isPressed ? "+" : "-") + std::to_string(change.code); }

} // namespace ZorvaTouch::Tools::Tests
