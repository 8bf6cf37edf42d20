#include "Tools/Daemon/KeyMapper.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <initializer_list>
#include <limits>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using State = KeyMapper::State;
using Changes = std::vector<KeyChange>;

constexpr double kPlayPause = 1;
constexpr double kVolumeDown = 2;
constexpr double kVolumeUp = 3;

HostEvent digitizer(std::uint32_t mask, std::uint16_t phase, double region) {
    HostEvent event(0, DigitizerFields{.eventMask = mask, .y = region}, 0);
    event.setPhase(phase);
    return event;
}
HostEvent vendorDefined(std::uint16_t usagePage, std::uint16_t usage) {
    return {0, VendorDefinedFields{.usagePage = usagePage, .usage = usage, .payload = {}}, 0};
}

HostEvent mayBegin(double region) { return digitizer(0, 128, region); }
HostEvent holdStart(double region) { return digitizer(0x2, 1, region); }
HostEvent holdChange(double region) { return digitizer(0x2, 2, region); }
HostEvent holdEnd(double region) { return digitizer(0x2, 4, region); }
HostEvent tap(double region) { return digitizer(0x20000, 0, region); }
HostEvent cancel() { return digitizer(0, 8, 0); }
HostEvent reset() { return vendorDefined(0xFF60, 2); }

class KeyMapperTest : public testing::Test {
protected:
    /// A mapper on which a touch has begun, or a hold in the volume-up region, with its key down.
    static KeyMapper mapperIn(State state, const KeyMap &map = KeyMap()) {
        KeyMapper mapper(map);
        if (state == State::Over)
            static_cast<void>(mapper.handle(SurfaceEnd::Stopped));
        if (state == State::Touching || state == State::Holding)
            static_cast<void>(mapper.handle(mayBegin(kVolumeUp)));
        if (state == State::Holding)
            static_cast<void>(mapper.handle(holdStart(kVolumeUp)));
        EXPECT_EQ(mapper.state(), state);
        return mapper;
    }

    /// What a mapper with these keys does from a touch's begin on.
    static Changes changesOfTouch(const std::vector<HostEvent> &events, const KeyMap &map = KeyMap()) {
        KeyMapper mapper = mapperIn(State::Touching, map);
        Changes changes;
        for (const HostEvent &event : events) {
            const KeyChanges more = mapper.handle(event);
            changes.insert(changes.end(), more.begin(), more.end());
        }
        return changes;
    }

    static KeyMap mapOf(std::initializer_list<const char *> texts) {
        KeyMap map;
        for (const char *text : texts)
            map.assign(text);
        return map;
    }
};

TEST_F(KeyMapperTest, ATapPressesAndReleasesItsRegionsKey) {
    EXPECT_EQ(changesOfTouch({tap(kPlayPause)}), (Changes{{164, true}, {164, false}}));
    EXPECT_EQ(changesOfTouch({tap(kVolumeDown)}), (Changes{{114, true}, {114, false}}));
    EXPECT_EQ(changesOfTouch({tap(kVolumeUp)}), (Changes{{115, true}, {115, false}}));
}

TEST_F(KeyMapperTest, AHoldKeepsItsKeyDownUntilItEnds) {
    EXPECT_EQ(changesOfTouch({holdStart(kVolumeDown)}), (Changes{{114, true}}));
    EXPECT_EQ(changesOfTouch({holdStart(kVolumeDown), holdEnd(kVolumeDown)}),
              (Changes{{114, true}, {114, false}}));
}

TEST_F(KeyMapperTest, AHoldInThePlayPauseRegionIsTheVoiceCommand) {
    EXPECT_EQ(changesOfTouch({holdStart(kPlayPause), holdEnd(kPlayPause)}),
              (Changes{{582, true}, {582, false}}));
}

TEST_F(KeyMapperTest, AHoldThatMovesLetsGoBeforeItPresses) {
    EXPECT_EQ(changesOfTouch({holdStart(kVolumeUp), holdChange(kVolumeDown), holdChange(kPlayPause),
                              holdEnd(kPlayPause)}),
              (Changes{{115, true}, {115, false}, {114, true}, {114, false}, {582, true}, {582, false}}));
}

TEST_F(KeyMapperTest, AHoldThatMovesToTheSameKeyKeepsItDown) {
    EXPECT_EQ(changesOfTouch({holdStart(kVolumeUp), holdChange(kVolumeUp), holdEnd(kVolumeUp)}),
              (Changes{{115, true}, {115, false}}));
    EXPECT_EQ(changesOfTouch({holdStart(kVolumeUp), holdChange(kVolumeDown), holdEnd(kVolumeDown)},
                             mapOf({"hold:volume-down=KEY_VOLUMEUP"})),
              (Changes{{115, true}, {115, false}}));
}

TEST_F(KeyMapperTest, AHoldReleasesTheKeyThatItPressedWhereverItEnds) {
    EXPECT_EQ(changesOfTouch({holdStart(kVolumeUp), holdEnd(kVolumeDown)}),
              (Changes{{115, true}, {115, false}}));
}

TEST_F(KeyMapperTest, ATouchActsOnlyOnce) {
    const Changes once{{115, true}, {115, false}};
    // A hold that a longer time-out has ended may be judged anew.
    EXPECT_EQ(changesOfTouch({holdStart(kVolumeUp), holdEnd(kVolumeUp), tap(kVolumeUp)}), once);
    EXPECT_EQ(changesOfTouch({holdStart(kVolumeUp), holdEnd(kVolumeUp), holdStart(kVolumeUp)}), once);
    EXPECT_EQ(changesOfTouch({tap(kVolumeUp), tap(kVolumeUp), holdStart(kVolumeUp)}), once);
}

TEST_F(KeyMapperTest, TheNextTouchActsAgain) {
    EXPECT_EQ(changesOfTouch({tap(kPlayPause), mayBegin(kPlayPause), tap(kPlayPause)}),
              (Changes{{164, true}, {164, false}, {164, true}, {164, false}}));
}

TEST_F(KeyMapperTest, AnUnmappedActionIsTheTouchsOneAllTheSame) {
    const KeyMap map = mapOf({"tap:volume-up=none", "hold:volume-up=none"});
    EXPECT_THAT(changesOfTouch({tap(kVolumeUp), tap(kVolumeDown)}, map), IsEmpty());
    EXPECT_THAT(changesOfTouch({holdStart(kVolumeUp), holdEnd(kVolumeUp), tap(kVolumeDown)}, map), IsEmpty());
}

TEST_F(KeyMapperTest, AHoldMovesInAndOutOfARegionWithoutAKey) {
    EXPECT_EQ(changesOfTouch(
                  {holdStart(kVolumeUp), holdChange(kVolumeDown), holdChange(kVolumeUp), holdEnd(kVolumeUp)},
                  mapOf({"hold:volume-up=none"})),
              (Changes{{114, true}, {114, false}}));
}

TEST_F(KeyMapperTest, WhatIsNoRegionHasNoKey) {
    for (const double region :
         {0.0, 4.0, -1.0, 1.5, 4294967297.0, std::nan(""), std::numeric_limits<double>::infinity()}) {
        EXPECT_THAT(changesOfTouch({tap(region)}), IsEmpty()) << region;
        EXPECT_THAT(changesOfTouch({holdStart(region), holdEnd(region)}), IsEmpty()) << region;
        EXPECT_EQ(changesOfTouch({holdStart(kVolumeUp), holdChange(region)}),
                  (Changes{{115, true}, {115, false}}))
            << region;
    }
}

TEST_F(KeyMapperTest, EveryEndReleasesWhatIsDown) {
    for (const SurfaceEnd end :
         {SurfaceEnd::Suspended, SurfaceEnd::Unscheduled, SurfaceEnd::DeviceGone, SurfaceEnd::Stopped}) {
        KeyMapper mapper = mapperIn(State::Holding);
        EXPECT_THAT(mapper.handle(end), ElementsAre(KeyChange{115, false}));
        EXPECT_EQ(mapper.keyDown(), kNoKey);
        EXPECT_THAT(mapper.handle(end), IsEmpty());
    }
}

TEST_F(KeyMapperTest, AfterSuspendTheNextTouchActs) {
    KeyMapper mapper = mapperIn(State::Holding);
    EXPECT_EQ(mapper.handle(SurfaceEnd::Suspended).size(), 1u);
    EXPECT_THAT(mapper.handle(holdChange(kVolumeDown)), IsEmpty());
    EXPECT_THAT(mapper.handle(mayBegin(kPlayPause)), IsEmpty());
    EXPECT_THAT(mapper.handle(tap(kPlayPause)), ElementsAre(KeyChange{164, true}, KeyChange{164, false}));
}

TEST_F(KeyMapperTest, EventsThatWereStillOnTheirWayDoNothing) {
    for (const SurfaceEnd end : {SurfaceEnd::Unscheduled, SurfaceEnd::DeviceGone, SurfaceEnd::Stopped}) {
        KeyMapper mapper{KeyMap()};
        EXPECT_THAT(mapper.handle(end), IsEmpty());
        EXPECT_THAT(mapper.handle(mayBegin(kVolumeUp)), IsEmpty());
        EXPECT_THAT(mapper.handle(holdStart(kVolumeUp)), IsEmpty());
        EXPECT_THAT(mapper.handle(tap(kVolumeUp)), IsEmpty());
    }
}

/// One pair of state and event: what is decided.
struct Outcome {
    State next;
    Changes changes;
};

/// A row of the table: an event, and what it does in each state. Whatever has a region is in volume-down;
/// what is down in a hold is volume-up.
struct Row {
    const char *name;
    std::function<KeyChanges(KeyMapper &)> give;
    Outcome idle, touching, holding, over;
};

Row eventRow(const char *name, const HostEvent &event, Outcome idle, Outcome touching, Outcome holding) {
    return {name,
            [event](KeyMapper &mapper) { return mapper.handle(event); },
            std::move(idle),
            std::move(touching),
            std::move(holding),
            {State::Over, {}}};
}

Row endRow(const char *name, SurfaceEnd end, State next) {
    return {name,
            [end](KeyMapper &mapper) { return mapper.handle(end); },
            {next, {}},
            {next, {}},
            {next, {{115, false}}},
            {State::Over, {}}};
}

std::vector<Row> allPairs() {
    const Outcome idle{State::Idle, {}};
    const Outcome touching{State::Touching, {}};
    const Outcome holding{State::Holding, {}};
    const Outcome letsGo{State::Idle, {{115, false}}};
    return {
        eventRow("may-begin", mayBegin(kVolumeDown), touching, touching, {State::Touching, {{115, false}}}),
        eventRow("hold start", holdStart(kVolumeDown), idle, {State::Holding, {{114, true}}}, letsGo),
        eventRow("hold change", holdChange(kVolumeDown), idle, idle,
                 {State::Holding, {{115, false}, {114, true}}}),
        eventRow("hold end", holdEnd(kVolumeDown), idle, idle, letsGo),
        eventRow("tap", tap(kVolumeDown), idle, {State::Idle, {{114, true}, {114, false}}}, letsGo),
        eventRow("cancel", cancel(), idle, idle, letsGo),
        eventRow("reset", reset(), idle, idle, letsGo),
        eventRow("unknown mask", digitizer(0x4, 1, kVolumeDown), idle, idle, letsGo),
        eventRow("two masks", digitizer(0x20002, 1, kVolumeDown), idle, idle, letsGo),
        eventRow("unknown phase", digitizer(0x2, 16, kVolumeDown), idle, idle, letsGo),
        eventRow("two phases", digitizer(0x2, 3, kVolumeDown), idle, idle, letsGo),
        eventRow("withdrawn hold", digitizer(0x2, 8, kVolumeDown), idle, idle, letsGo),
        eventRow("hold without a phase", digitizer(0x2, 0, kVolumeDown), idle, idle, letsGo),
        eventRow("tap with a phase", digitizer(0x20000, 1, kVolumeDown), idle, idle, letsGo),
        eventRow("neither mask nor phase", digitizer(0, 0, kVolumeDown), idle, idle, letsGo),
        eventRow("vendor's other usage", vendorDefined(0xFF60, 3), idle, touching, holding),
        eventRow("vendor's other page", vendorDefined(0xFF00, 2), idle, touching, holding),
        eventRow("accelerometer", HostEvent(0, AccelerometerFields{0, 3, 1}, 0), idle, touching, holding),
        endRow("suspended", SurfaceEnd::Suspended, State::Idle),
        endRow("unscheduled", SurfaceEnd::Unscheduled, State::Over),
        endRow("device gone", SurfaceEnd::DeviceGone, State::Over),
        endRow("stopped", SurfaceEnd::Stopped, State::Over),
    };
}

TEST_F(KeyMapperTest, EveryPairOfStateAndEventIsDecided) {
    for (const Row &row : allPairs()) {
        const std::pair<State, const Outcome &> pairs[] = {{State::Idle, row.idle},
                                                           {State::Touching, row.touching},
                                                           {State::Holding, row.holding},
                                                           {State::Over, row.over}};
        for (const auto &[state, outcome] : pairs) {
            SCOPED_TRACE(std::string(row.name) + " in state " + std::to_string(static_cast<int>(state)));
            KeyMapper mapper = mapperIn(state);
            const KeyChanges changes = row.give(mapper);
            EXPECT_EQ(Changes(changes.begin(), changes.end()), outcome.changes);
            EXPECT_EQ(mapper.state(), outcome.next);
        }
    }
}

} // namespace
} // namespace ZorvaTouch::Tools
