#include "Shared/Algs.h"

#include "Tests/Support/FramesGenerators.h"
#include "Tests/Support/FramesScript.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

namespace ZorvaTouch {
namespace {

namespace gen = rc::gen;
using Scripted::anySensorFrames;
using Scripted::fingerVisits;
using Scripted::framesOf;
using Scripted::fullRange;
using Scripted::KeyWrite;
using Scripted::SensorFrame;
using Scripted::upTo;

/// Counts a recognizer's events and asserts that they come in an order that makes sense.
class EventOrder {
public:
    /// Takes the frame that `algs` has just processed.
    void check(const Algs &algs, const HostEventList &events) {
        RC_ASSERT(events.size() <= 1u);
        const bool isTouching = algs.handStats().isTouching;
        RC_ASSERT((isTouching && !_isTouching) == (!events.empty() && gestureOf(*events[0]) == "may-begin"));
        if (!events.empty())
            note(gestureOf(*events[0]), isTouching);
        _isTouching = isTouching;
    }

    std::uint64_t mayBegins = 0;
    std::uint64_t holdStarts = 0;
    std::uint64_t holdEnds = 0;
    std::uint64_t taps = 0;
    std::uint64_t cancels = 0;

private:
    static std::string gestureOf(const HostEvent &event) {
        const std::string text = Scripted::eventText(event);
        return text.substr(0, text.find(' '));
    }

    void note(const std::string &gesture, bool isTouching) {
        if (gesture == "may-begin") {
            ++mayBegins;
            _isAnswered = false;
        } else if (gesture == "hold-start") {
            RC_ASSERT(_isTouching);
            RC_ASSERT(!_isHolding);
            _isHolding = true;
            ++holdStarts;
        } else if (gesture == "hold-change") {
            RC_ASSERT(_isHolding);
        } else if (gesture == "hold-end") {
            RC_ASSERT(_isHolding);
            _isHolding = false;
            ++holdEnds;
        } else {
            RC_ASSERT(gesture == "tap" || gesture == "cancel");
            RC_ASSERT(_isTouching);
            RC_ASSERT(!isTouching);
            RC_ASSERT(!_isHolding);
            RC_ASSERT(mayBegins > 0u);
            RC_ASSERT(!_isAnswered);
            _isAnswered = true;
            ++(gesture == "tap" ? taps : cancels);
        }
    }

    bool _isTouching = false;
    bool _isHolding = false;
    bool _isAnswered = true; ///< the last may-begin has had its tap or cancel
};

/// Feeds the frames, numbered from 0, and checks every one.
EventOrder checkedOrder(Algs &algs, const std::vector<SensorFrame> &frames) {
    EventOrder order;
    std::uint32_t number = 0;
    for (const SensorFrame &frame : frames) {
        HostEventList events;
        algs.processTouchFrame(frame.signals, number, frame.timeMs, events);
        order.check(algs, events);
        if (!events.empty())
            RC_ASSERT(events[0]->integerField(kDigitizerFieldFrameNumber) ==
                      static_cast<std::int64_t>(number));
        ++number;
    }
    return order;
}

void assertCountersFollow(const EventStats &stats, const EventOrder &order) {
    RC_ASSERT(stats.numTaps == order.taps);
    RC_ASSERT(stats.numBeginHold == order.holdStarts);
    RC_ASSERT(stats.numEndHold == order.holdEnds);
    RC_ASSERT(stats.numPlayPause + stats.numVolumeDown + stats.numVolumeUp == order.taps);
    RC_ASSERT(stats.numHolding2Suppressed == 0u);
}

RC_GTEST_PROP(GestureProperty, AnyFramesGiveOrderedEvents, ()) {
    Algs algs(Ports::silentLogProvider());
    const EventOrder order = checkedOrder(algs, *anySensorFrames());
    const EventStats &stats = algs.eventStats();
    RC_ASSERT(stats.numTaps == order.taps);
    RC_ASSERT(stats.numBeginHold == order.holdStarts);
    RC_ASSERT(stats.numEndHold == order.holdEnds);
}

RC_GTEST_PROP(GestureProperty, EveryFingersVisitComesToAnEnd, ()) {
    Algs algs(Ports::silentLogProvider());
    const EventOrder order = checkedOrder(algs, framesOf(*fingerVisits()));
    RC_CLASSIFY(order.taps > 0u, "with taps");
    RC_CLASSIFY(order.cancels > 0u, "with cancels");
    RC_CLASSIFY(order.holdEnds > 0u, "with holds");
    RC_ASSERT(!algs.handStats().isTouching);
    RC_ASSERT(order.mayBegins == order.taps + order.cancels + order.holdEnds);
    RC_ASSERT(order.holdStarts == order.holdEnds);
    assertCountersFollow(algs.eventStats(), order);
    RC_ASSERT(algs.eventStats().numRejectedTap + algs.eventStats().numRejectedEndHold == order.cancels);
}

RC_GTEST_PROP(GestureProperty, KeyWritesInBetweenKeepTheOrder, ()) {
    Algs algs(Ports::silentLogProvider());
    EventOrder order;
    std::vector<SensorFrame> frames = *gen::oneOf(
        anySensorFrames(), gen::map(fingerVisits(), [](const auto &visits) { return framesOf(visits); }));
    const auto writes = *upTo(100, Scripted::keyWrite());
    for (std::size_t i = 0; i < frames.size(); ++i) {
        if (i % 7 == 3 && i / 7 < writes.size())
            algs.setState(writes[i / 7].key.substr(5), writes[i / 7].value); // without "Algs."
        HostEventList events;
        algs.processTouchFrame(frames[i].signals, static_cast<std::uint32_t>(i), frames[i].timeMs, events);
        order.check(algs, events);
    }
}

RC_GTEST_PROP(GestureProperty, ADeviceResetEndsEveryTouch, ()) {
    Algs algs(Ports::silentLogProvider());
    std::vector<SensorFrame> frames = framesOf(*fingerVisits());
    frames.resize(*fullRange(gen::inRange<std::size_t>(0, frames.size() + 1)));
    EventOrder order;
    for (const SensorFrame &frame : frames) {
        HostEventList events;
        algs.processTouchFrame(frame.signals, 1, frame.timeMs, events);
        order.check(algs, events);
    }
    const bool wasTouching = algs.handStats().isTouching;
    const HostEventList events = algs.handleReset();
    order.check(algs, events);
    RC_ASSERT(events.size() == (wasTouching ? 1u : 0u));
    RC_ASSERT(!algs.handStats().isTouching);
    RC_ASSERT(algs.handleReset().empty());
}

/// Everything that a recognizer says of the frames.
std::string transcript(const std::vector<SensorFrame> &frames) {
    Algs algs(Ports::silentLogProvider());
    std::string text;
    for (const SensorFrame &frame : frames) {
        HostEventList events;
        algs.processTouchFrame(frame.signals, 1, frame.timeMs, events);
        for (const auto &event : events)
            text += jsonText(*event) + "\n";
        text += algs.touchStateDescription(frame.signals, frame.timeMs) + "\n";
        text += algs.virtualStateDescription(frame.signals, frame.timeMs) + "\n";
    }
    return text;
}

RC_GTEST_PROP(GestureProperty, TheSameFramesSayTheSame, ()) {
    const auto frames = *anySensorFrames();
    RC_ASSERT(transcript(frames) == transcript(frames));
}

} // namespace
} // namespace ZorvaTouch
