#include "Fuzz/Transcript.h"
#include "Tools/Daemon/HeldKeys.h"
#include "Tools/Daemon/KeyMapper.h"

#include <array>
#include <bit>
#include <fuzzer/FuzzedDataProvider.h>
#include <string>

// Targets: Tools/Daemon/HeldKeys.cpp Tools/Daemon/KeyMap.cpp Tools/Daemon/KeyMapper.cpp
//
// Length: 256
//
// The road from events to keys: no text crashes the map, and whatever two surfaces say, a touch acts at most
// once and the keyboard has a release for each press and a press for each release.

using namespace ZorvaTouch;

namespace {

constexpr std::uint32_t kMasks[] = {0, kEventMaskHold, kEventMaskTap, kEventMaskHold | kEventMaskTap};
constexpr std::uint16_t kPhases[] = {kEventPhaseNone,  kEventPhaseBegan,     kEventPhaseChanged,
                                     kEventPhaseEnded, kEventPhaseCancelled, kEventPhaseMayBegin};

/// Keys that the text may change.
Tools::KeyMap makeMap(FuzzedDataProvider &input) {
    Tools::KeyMap map;
    while (input.ConsumeBool()) {
        const std::string text = input.ConsumeRandomLengthString(64);
        const Tools::KeyMap before = map;
        try {
            map.assign(text);
        } catch (const Tools::KeyMapError &error) {
            ZORVA_MUST(map == before);
            ZORVA_MUST(std::string(error.what()).find('\n') == std::string::npos);
        }
    }
    Tools::KeyMap copy;
    for (const std::string &text : map.texts())
        copy.assign(text);
    ZORVA_MUST(copy == map);
    return map;
}

HostEvent makeDigitizer(std::uint32_t mask, std::uint16_t phase, double region) {
    HostEvent event(0, DigitizerFields{.eventMask = mask, .y = region}, 0);
    event.setPhase(phase);
    return event;
}

HostEvent makeEvent(FuzzedDataProvider &input) {
    switch (input.ConsumeIntegralInRange(0, 7)) {
    case 0:
        return makeDigitizer(input.ConsumeIntegral<std::uint32_t>(), input.ConsumeIntegral<std::uint16_t>(),
                             std::bit_cast<double>(input.ConsumeIntegral<std::uint64_t>()));
    case 1:
        return {0,
                VendorDefinedFields{.usagePage = input.PickValueInArray<std::uint16_t>({0xFF60, 0xFF00}),
                                    .usage = input.ConsumeIntegralInRange<std::uint16_t>(1, 3),
                                    .payload = {}},
                0};
    case 2:
        return {0, AccelerometerFields{}, 0};
    default:
        return makeDigitizer(input.PickValueInArray(kMasks), input.PickValueInArray(kPhases),
                             static_cast<double>(input.ConsumeIntegralInRange(0, 4)));
    }
}

bool isMayBegin(const HostEvent &event) {
    return event.digitizer() && event.digitizer()->eventMask == 0 && event.phase() == kEventPhaseMayBegin;
}
bool isHoldChange(const HostEvent &event) {
    return event.digitizer() && event.digitizer()->eventMask == kEventMaskHold &&
           event.phase() == kEventPhaseChanged;
}

/// The one keyboard, as its reader sees it.
class Keyboard {
public:
    void take(Tools::KeyChange change) {
        if (!_held.take(change))
            return;
        ZORVA_MUST(_isDown[change.code] != change.isPressed);
        _isDown[change.code] = change.isPressed;
        _downCount += change.isPressed ? 1 : -1;
    }

    [[nodiscard]] bool isDown(Tools::KeyCode code) const { return _isDown[code]; }
    [[nodiscard]] int downCount() const { return _downCount; }

private:
    Tools::HeldKeys _held;
    std::array<bool, Tools::kKeyCodeCount> _isDown{};
    int _downCount = 0;
};

/// One surface and what must hold for its keys.
class Surface {
public:
    Surface(const Tools::KeyMap &map, Keyboard &keyboard) : _mapper(map), _keyboard(keyboard) {}

    void take(const HostEvent &event) {
        if (isMayBegin(event))
            _mayAct = true;
        passOn(_mapper.handle(event), isHoldChange(event) && _mapper.state() == State::Holding);
    }

    void take(Tools::SurfaceEnd end) {
        passOn(_mapper.handle(end), false);
        ZORVA_MUST(_down == Tools::kNoKey);
        ZORVA_MUST(end == Tools::SurfaceEnd::Suspended || _mapper.state() == State::Over);
    }

private:
    using State = Tools::KeyMapper::State;

    void passOn(const Tools::KeyChanges &changes, bool isMove) {
        for (const Tools::KeyChange change : changes) {
            if (change.isPressed) {
                ZORVA_MUST(_down == Tools::kNoKey);
                ZORVA_MUST(_mayAct || isMove);
                _mayAct = false;
            } else {
                ZORVA_MUST(_down == change.code);
            }
            _down = change.isPressed ? change.code : Tools::kNoKey;
            _keyboard.take(change);
        }
        ZORVA_MUST(_mapper.keyDown() == _down);
        ZORVA_MUST(_down == Tools::kNoKey || (_mapper.state() == State::Holding && _keyboard.isDown(_down)));
    }

    Tools::KeyMapper _mapper;
    Keyboard &_keyboard;
    Tools::KeyCode _down = Tools::kNoKey;
    bool _mayAct = false;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    FuzzedDataProvider input(data, size);
    const Tools::KeyMap map = makeMap(input);
    Keyboard keyboard;
    std::array<Surface, 2> surfaces{Surface(map, keyboard), Surface(map, keyboard)};
    while (input.remaining_bytes() > 0) {
        Surface &surface = surfaces[input.ConsumeIntegralInRange<std::size_t>(0, 1)];
        if (input.ConsumeIntegralInRange(0, 15) == 0)
            surface.take(static_cast<Tools::SurfaceEnd>(input.ConsumeIntegralInRange(0, 3)));
        else
            surface.take(makeEvent(input));
    }
    for (Surface &surface : surfaces)
        surface.take(Tools::SurfaceEnd::Stopped);
    ZORVA_MUST(keyboard.downCount() == 0);
    return 0;
}
