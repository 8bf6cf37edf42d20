#include "Shared/Algs.h"
#include "Tests/Support/FramesGenerators.h"
#include "Tools/Daemon/HeldKeys.h"
#include "Tools/Daemon/KeyMapper.h"
#include "Tools/Daemon/KeyQuarantine.h"
#include "Tools/Stimulus/EventNames.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <algorithm>
#include <array>
#include <optional>
#include <ostream>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

namespace gen = rc::gen;
using Scripted::fingerVisits;
using Scripted::framesOf;
using Scripted::SensorFrame;
using Scripted::upTo;

/// Something that a mapper is told: an event of the digitizer, of another kind, or an end.
struct Step {
    enum Kind { kDigitizer, kVendorDefined, kAccelerometer, kEnd };
    Kind kind = kDigitizer;
    std::uint32_t mask = 0;   ///< or the vendor's usage
    std::uint16_t phase = 0;  ///< or the vendor's usage page
    std::uint32_t region = 0; ///< or which end
    std::size_t surface = 0;
};

void showValue(const Step &step, std::ostream &os) {
    os << "{kind " << step.kind << ", mask " << step.mask << ", phase " << step.phase << ", region "
       << step.region << ", surface " << step.surface << "}";
}

HostEvent eventOf(const Step &step) {
    if (step.kind == Step::kVendorDefined)
        return {0,
                VendorDefinedFields{
                    .usagePage = step.phase, .usage = static_cast<std::uint16_t>(step.mask), .payload = {}},
                0};
    if (step.kind == Step::kAccelerometer)
        return {0, AccelerometerFields{}, 0};
    HostEvent event(0, DigitizerFields{.eventMask = step.mask, .y = static_cast<double>(step.region)}, 0);
    event.setPhase(step.phase);
    return event;
}

KeyChanges give(KeyMapper &mapper, const Step &step) {
    return step.kind == Step::kEnd ? mapper.handle(static_cast<SurfaceEnd>(step.region))
                                   : mapper.handle(eventOf(step));
}

rc::Gen<Step> digitizerStep(rc::Gen<std::uint32_t> mask, rc::Gen<std::uint16_t> phase) {
    return gen::build<Step>(gen::set(&Step::mask, std::move(mask)), gen::set(&Step::phase, std::move(phase)),
                            gen::set(&Step::region, gen::inRange(0u, 6u)),
                            gen::set(&Step::surface, gen::inRange<std::size_t>(0, 2)));
}

rc::Gen<Step> gestureStep(std::uint32_t mask, std::uint16_t phase) {
    return digitizerStep(gen::just(mask), gen::just(phase));
}

rc::Gen<Step> otherStep(Step::Kind kind, std::uint32_t mask, std::uint16_t phase) {
    return gen::map(gen::pair(gen::inRange(0u, 4u), gen::inRange<std::size_t>(0, 2)),
                    [=](const std::pair<std::uint32_t, std::size_t> &choice) {
                        return Step{kind, mask, phase, choice.first, choice.second};
                    });
}

/// Gestures in any order, with what is no gesture among them.
rc::Gen<Step> anyStep() {
    return gen::weightedOneOf<Step>(
        {{40, gestureStep(0, kEventPhaseMayBegin)},
         {30, gestureStep(kEventMaskHold, kEventPhaseBegan)},
         {30, gestureStep(kEventMaskHold, kEventPhaseChanged)},
         {10, gestureStep(kEventMaskHold, kEventPhaseEnded)},
         {20, gestureStep(kEventMaskTap, kEventPhaseNone)},
         {5, gestureStep(0, kEventPhaseCancelled)},
         {5, digitizerStep(gen::arbitrary<std::uint32_t>(), gen::arbitrary<std::uint16_t>())},
         {5, otherStep(Step::kVendorDefined, 2, 0xFF60)},
         {5, otherStep(Step::kVendorDefined, 3, 0xFF60)},
         {5, otherStep(Step::kAccelerometer, 0, 0)},
         {1, otherStep(Step::kEnd, 0, 0)}});
}

/// Any map, often with the same key in several places.
rc::Gen<KeyMap> anyMap() {
    const auto text =
        gen::map(gen::tuple(gen::element<std::string>("tap", "hold"),
                            gen::element<std::string>("play-pause", "volume-down", "volume-up"),
                            gen::element<std::string>("none", "KEY_VOLUMEUP", "KEY_VOLUMEDOWN", "KEY_MUTE",
                                                      "KEY_F13")),
                 [](const std::tuple<std::string, std::string, std::string> &words) {
                     return std::get<0>(words) + ":" + std::get<1>(words) + "=" + std::get<2>(words);
                 });
    return gen::map(gen::container<std::vector<std::string>>(text),
                    [](const std::vector<std::string> &texts) {
                        KeyMap map;
                        for (const std::string &assignment : texts)
                            map.assign(assignment);
                        return map;
                    });
}

/// Asserts what holds for one surface's keys, whatever it is told.
class OneSurface {
public:
    explicit OneSurface(const KeyMap &map) : _mapper(map) {}

    KeyChanges take(const Step &step) {
        const auto gesture = step.kind == Step::kEnd ? std::nullopt : gestureOf(eventOf(step));
        const KeyChanges changes = give(_mapper, step);
        noteTouch(gesture);
        for (const KeyChange change : changes)
            noteChange(change, gesture);
        const bool isForeign =
            step.kind == Step::kAccelerometer ||
            (step.kind == Step::kVendorDefined && !(step.mask == 2 && step.phase == 0xFF60));
        if (!isForeign)
            noteHold(gesture);
        RC_ASSERT(!isForeign || changes.empty());
        RC_ASSERT(_mapper.keyDown() == _down);
        return changes;
    }

    [[nodiscard]] KeyCode down() const { return _down; }

private:
    void noteTouch(std::optional<Gesture> gesture) {
        if (gesture == Gesture::MayBegin)
            _mayAct = true;
    }

    /// A press needs a touch that has not acted, or a hold that goes on; a release, the same key's press.
    void noteChange(KeyChange change, std::optional<Gesture> gesture) {
        if (!change.isPressed) {
            RC_ASSERT(_down == change.code);
            _down = kNoKey;
            return;
        }
        RC_ASSERT(change.code != kNoKey);
        RC_ASSERT(_down == kNoKey);
        const bool isMove = gesture == Gesture::HoldChange && _isHolding;
        const bool isFirst = (gesture == Gesture::Tap || gesture == Gesture::HoldStart) && _mayAct;
        RC_ASSERT(isMove || isFirst);
        _mayAct = false;
        _down = change.code;
    }

    /// Nothing is down but while a hold goes on.
    void noteHold(std::optional<Gesture> gesture) {
        const bool isMove = _isHolding && gesture == Gesture::HoldChange;
        const bool isBegin = !_isHolding && gesture == Gesture::HoldStart;
        RC_ASSERT(_down == kNoKey || isMove || isBegin);
        _isHolding = isMove || isBegin;
    }

    KeyMapper _mapper;
    KeyCode _down = kNoKey;
    bool _mayAct = false;
    bool _isHolding = false;
};

RC_GTEST_PROP(KeyMapperProperty, ATouchActsOnceAndEveryKeyComesUp, ()) {
    OneSurface surface(*anyMap());
    std::size_t presses = 0;
    for (const Step &step : *upTo(200, anyStep()))
        presses += surface.take(step).size();
    RC_CLASSIFY(presses > 0u, "with presses");
    static_cast<void>(surface.take({.kind = Step::kEnd, .region = 3}));
    RC_ASSERT(surface.down() == kNoKey);
}

RC_GTEST_PROP(KeyMapperProperty, TwoSurfacesPlayOneKeyboard, ()) {
    const KeyMap map = *anyMap();
    std::array<OneSurface, 2> surfaces{OneSurface(map), OneSurface(map)};
    HeldKeys held;
    std::array<bool, kKeyCodeCount> isDown{}; // as the keyboard's reader sees it
    const auto take = [&](const Step &step) {
        for (const KeyChange change : surfaces[step.surface].take(step))
            if (held.take(change)) {
                RC_ASSERT(isDown[change.code] != change.isPressed);
                isDown[change.code] = change.isPressed;
            }
        for (const KeyCode code : map.codes())
            RC_ASSERT(isDown[code] == (surfaces[0].down() == code || surfaces[1].down() == code));
    };
    for (const Step &step : *upTo(200, anyStep()))
        take(step);
    take({.kind = Step::kEnd, .region = 1, .surface = 0});
    take({.kind = Step::kEnd, .region = 2, .surface = 1});
    RC_ASSERT(std::ranges::none_of(isDown, [](bool down) { return down; }));
}

RC_GTEST_PROP(KeyMapperProperty, WhatTheRecognizerMakesIsNeverWasted, ()) {
    const KeyMap map = *anyMap();
    KeyMapper mapper(map);
    Algs algs(Ports::silentLogProvider());
    std::uint32_t number = 0;
    std::size_t changeCount = 0;
    for (const SensorFrame &frame : framesOf(*fingerVisits())) {
        HostEventList events;
        algs.processTouchFrame(frame.signals, number++, frame.timeMs, events);
        for (const auto &event : events) {
            const KeyChanges changes = mapper.handle(*event);
            changeCount += changes.size();
            const auto gesture = gestureOf(*event);
            const KeyCode tapped = map.tapKey(regionOf(*event));
            if (gesture == Gesture::Tap)
                RC_ASSERT(changes.size() == (tapped == kNoKey ? 0u : 2u));
            const bool isHold = gesture == Gesture::HoldStart || gesture == Gesture::HoldChange;
            RC_ASSERT(mapper.keyDown() == (isHold ? map.holdKey(regionOf(*event)) : kNoKey));
        }
    }
    RC_CLASSIFY(changeCount > 0u, "with presses");
}

/// Whatever a surface does, however fast: no key stays down, and no second has more presses than the limit.
RC_GTEST_PROP(KeyQuarantineProperty, KeysComeUpAndNoSecondHasTooManyPresses, ()) {
    constexpr std::uint64_t kMs = 1'000'000;
    const auto limit = *gen::inRange(1u, 6u);
    KeyMapper mapper(*anyMap());
    KeyQuarantine quarantine(limit);
    std::vector<std::uint64_t> pressed;
    std::uint64_t timeNs = 0, attempts = 0, suppressed = 0;
    bool isActive = false;
    KeyCode down = kNoKey;
    const auto take = [&](const Step &step) {
        const KeyChanges given = give(mapper, step);
        attempts += static_cast<std::uint64_t>(
            std::ranges::count_if(given, [](KeyChange change) { return change.isPressed; }));
        const auto [changes, transition] = quarantine.filter(given, timeNs);
        for (const KeyChange change : changes) {
            RC_ASSERT(down == (change.isPressed ? kNoKey : change.code));
            down = change.isPressed ? change.code : kNoKey;
            if (change.isPressed)
                pressed.push_back(timeNs);
        }
        RC_ASSERT(down == quarantine.keyDown());
        if (transition != KeyQuarantine::Transition::None) {
            RC_ASSERT(isActive == (transition == KeyQuarantine::Transition::Ends));
            suppressed += isActive ? quarantine.suppressed() : 0;
            isActive = !isActive;
        }
        RC_ASSERT(!isActive || down == kNoKey);
    };
    for (const Step &step : *upTo(200, anyStep())) {
        timeNs += *gen::weightedElement<std::uint64_t>({{30, 0}, {10, 50}, {2, 400}, {1, 2000}}) * kMs;
        take(step);
    }
    take({.kind = Step::kEnd, .region = 3});
    RC_ASSERT(down == kNoKey);
    RC_ASSERT(attempts == pressed.size() + suppressed + (isActive ? quarantine.suppressed() : 0));
    for (std::size_t first = 0; first + limit < pressed.size(); ++first)
        RC_ASSERT(pressed[first + limit] - pressed[first] >= KeyQuarantine::kWindowNs);
    RC_CLASSIFY(attempts > pressed.size(), "with a quarantine");
}

RC_GTEST_PROP(KeyMapProperty, AMapsTextsMakeTheSameMap, ()) {
    const KeyMap map = *anyMap();
    KeyMap read = *anyMap();
    for (const std::string &text : map.texts())
        read.assign(text);
    RC_ASSERT(read == map);
}

RC_GTEST_PROP(KeyMapProperty, AnyTextIsTakenOrRefusedInOneLine, ()) {
    const auto words = *gen::container<std::vector<std::string>>(gen::oneOf(
        gen::element<std::string>("tap", "hold", ":", "=", "volume-up", "play-pause", "KEY_MUTE", "none"),
        gen::arbitrary<std::string>()));
    std::string text;
    for (const std::string &word : words)
        text.append(word);
    KeyMap map;
    try {
        map.assign(text);
        RC_ASSERT(std::ranges::count(map.texts(), text) == 1);
    } catch (const KeyMapError &error) {
        RC_ASSERT(std::string(error.what()).find('\n') == std::string::npos);
        RC_ASSERT(map == KeyMap());
    }
}

} // namespace
} // namespace ZorvaTouch::Tools
