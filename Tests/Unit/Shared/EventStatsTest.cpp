#include "Shared/EventStats.h"

#include "Shared/HandStats.h"

#include <array>
#include <string>
#include <vector>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

struct NamedCounter {
    const char *name;
    std::uint64_t EventStats::*counter;
};

/// All counters in the order of their declaration.
constexpr std::array<NamedCounter, 24> kCounters{{
    {"numTaps", &EventStats::numTaps},
    {"numBeginHold", &EventStats::numBeginHold},
    {"numIncrementHold", &EventStats::numIncrementHold},
    {"numEndHold", &EventStats::numEndHold},
    {"numVolumeUp", &EventStats::numVolumeUp},
    {"numVolumeDown", &EventStats::numVolumeDown},
    {"numPlayPause", &EventStats::numPlayPause},
    {"numKeloCall", &EventStats::numKeloCall},
    {"numKeloCallIncrement", &EventStats::numKeloCallIncrement},
    {"numVolumeIncrement", &EventStats::numVolumeIncrement},
    {"numVolumeDecrement", &EventStats::numVolumeDecrement},
    {"numRejectedTap", &EventStats::numRejectedTap},
    {"numRejectedBeginHold", &EventStats::numRejectedBeginHold},
    {"numRejectedIncrementHold", &EventStats::numRejectedIncrementHold},
    {"numRejectedEndHold", &EventStats::numRejectedEndHold},
    {"numRejectedVolumeUp", &EventStats::numRejectedVolumeUp},
    {"numRejectedVolumeDown", &EventStats::numRejectedVolumeDown},
    {"numRejectedPlayPause", &EventStats::numRejectedPlayPause},
    {"numRejectedKeloCall", &EventStats::numRejectedKeloCall},
    {"numRejectedKeloCallIncrement", &EventStats::numRejectedKeloCallIncrement},
    {"numRejectedVolumeIncrement", &EventStats::numRejectedVolumeIncrement},
    {"numRejectedVolumeDecrement", &EventStats::numRejectedVolumeDecrement},
    {"numSuppressed2Holding", &EventStats::numSuppressed2Holding},
    {"numHolding2Suppressed", &EventStats::numHolding2Suppressed},
}};

/// The counters that are not 0, such as "numTaps=1 numPlayPause=1".
std::string counted(const EventStats &stats) {
    std::string text;
    for (const NamedCounter &entry : kCounters)
        if (stats.*entry.counter != 0)
            text += (text.empty() ? "" : " ") + std::string(entry.name) + "=" +
                    std::to_string(stats.*entry.counter);
    return text;
}

/// What one frame counts in each region: none, play/pause, volume down, volume up.
void expectCounts(HandStats hand, const std::array<const char *, 4> &byRegion) {
    for (const PixelRegion region :
         {kPixelRegionNone, kPixelRegionPlayPause, kPixelRegionVolumeDown, kPixelRegionVolumeUp}) {
        hand.activeRegion = region;
        EventStats stats;
        stats.update(hand);
        EXPECT_EQ(counted(stats), byRegion[region]) << "region " << region;
    }
}

void expectNothing(const HandStats &hand) { expectCounts(hand, {"", "", "", ""}); }

/// A hand in the middle of a touch.
HandStats touching() {
    HandStats hand;
    hand.isTouching = hand.wasTouching = true;
    return hand;
}

/// A hand in the frame of the release.
HandStats released() {
    HandStats hand;
    hand.wasTouching = true;
    return hand;
}

/// Every flag that speaks for a later rule than the first.
void raiseEverything(HandStats &hand) {
    hand.isHolding = hand.wasHolding = hand.isHoldSuppressed = hand.wasHoldSuppressed = true;
    hand.isPastHoldTimeout = hand.wasPastHoldTimeout = hand.isTapCandidate = hand.isTap = true;
}

TEST(EventStats, StartsAtZero) { EXPECT_EQ(counted(EventStats()), ""); }

TEST(EventStats, NothingIsCountedInAnIdleFrame) {
    expectNothing(HandStats());
    expectNothing(touching());
    expectNothing(released());
}

TEST(EventStats, FirstTouchedFrameCountsNothingWhateverElseItShows) {
    HandStats hand;
    hand.isTouching = true;
    expectNothing(hand);
    raiseEverything(hand);
    expectNothing(hand);
}

TEST(EventStats, FlagsThatDecideNothingCountNothing) {
    HandStats hand = touching();
    hand.isTapRejected = hand.isAboveFloor = hand.wasAboveFloor = hand.wasHoldSuppressed = true;
    hand.isPastHoldTimeout = true;
    expectNothing(hand);
    hand.wasPastHoldTimeout = true; // still past it
    expectNothing(hand);
}

TEST(EventStats, FirstSuppressedFrame) {
    HandStats hand = touching();
    hand.isHoldSuppressed = hand.isPastHoldTimeout = true;
    expectCounts(hand, {"numRejectedBeginHold=1", "numRejectedBeginHold=1 numRejectedKeloCall=1",
                        "numRejectedBeginHold=1 numRejectedVolumeDecrement=1",
                        "numRejectedBeginHold=1 numRejectedVolumeIncrement=1"});
}

TEST(EventStats, FurtherSuppressedFrame) {
    HandStats hand = touching();
    hand.isHoldSuppressed = hand.isPastHoldTimeout = hand.wasPastHoldTimeout = true;
    expectCounts(hand,
                 {"numRejectedIncrementHold=1", "numRejectedIncrementHold=1 numRejectedKeloCallIncrement=1",
                  "numRejectedIncrementHold=1 numRejectedVolumeDecrement=1",
                  "numRejectedIncrementHold=1 numRejectedVolumeIncrement=1"});
}

TEST(EventStats, SuppressedFrameThatIsNotPastTheTimeoutCountsItsVolumeOnly) {
    HandStats hand = touching();
    hand.isHoldSuppressed = true; // a stale flag: no begin is counted, meant
    expectCounts(hand, {"", "", "numRejectedVolumeDecrement=1", "numRejectedVolumeIncrement=1"});
    hand.wasPastHoldTimeout = true;
    expectCounts(hand, {"", "", "numRejectedVolumeDecrement=1", "numRejectedVolumeIncrement=1"});
}

TEST(EventStats, HoldThatBecameSuppressedIsCountedBesideTheFrame) {
    HandStats hand = touching();
    hand.isHoldSuppressed = hand.wasHolding = true;
    expectCounts(hand, {"numHolding2Suppressed=1", "numHolding2Suppressed=1",
                        "numRejectedVolumeDecrement=1 numHolding2Suppressed=1",
                        "numRejectedVolumeIncrement=1 numHolding2Suppressed=1"});
    hand.isPastHoldTimeout = true;
    expectCounts(hand, {"numRejectedBeginHold=1 numHolding2Suppressed=1",
                        "numRejectedBeginHold=1 numRejectedKeloCall=1 numHolding2Suppressed=1",
                        "numRejectedBeginHold=1 numRejectedVolumeDecrement=1 numHolding2Suppressed=1",
                        "numRejectedBeginHold=1 numRejectedVolumeIncrement=1 numHolding2Suppressed=1"});
    hand.wasPastHoldTimeout = true;
    expectCounts(hand, {"numRejectedIncrementHold=1 numHolding2Suppressed=1",
                        "numRejectedIncrementHold=1 numRejectedKeloCallIncrement=1 numHolding2Suppressed=1",
                        "numRejectedIncrementHold=1 numRejectedVolumeDecrement=1 numHolding2Suppressed=1",
                        "numRejectedIncrementHold=1 numRejectedVolumeIncrement=1 numHolding2Suppressed=1"});
}

TEST(EventStats, SuppressionDecidesBeforeEverythingAfterIt) {
    HandStats hand = touching();
    raiseEverything(hand);
    expectCounts(hand, {"numRejectedIncrementHold=1 numHolding2Suppressed=1",
                        "numRejectedIncrementHold=1 numRejectedKeloCallIncrement=1 numHolding2Suppressed=1",
                        "numRejectedIncrementHold=1 numRejectedVolumeDecrement=1 numHolding2Suppressed=1",
                        "numRejectedIncrementHold=1 numRejectedVolumeIncrement=1 numHolding2Suppressed=1"});
    hand.wasPastHoldTimeout = hand.wasHolding = false;
    expectCounts(hand, {"numRejectedBeginHold=1", "numRejectedBeginHold=1 numRejectedKeloCall=1",
                        "numRejectedBeginHold=1 numRejectedVolumeDecrement=1",
                        "numRejectedBeginHold=1 numRejectedVolumeIncrement=1"});
    hand.isPastHoldTimeout = false;
    hand.wasPastHoldTimeout = true;
    expectCounts(hand, {"", "", "numRejectedVolumeDecrement=1", "numRejectedVolumeIncrement=1"});
}

TEST(EventStats, AStaleSuppressionIsCountedWithNothingTouchedToo) {
    HandStats hand; // as switching the suppression off during a suppressed hold leaves it
    hand.isHoldSuppressed = hand.wasHoldSuppressed = hand.isPastHoldTimeout = hand.wasPastHoldTimeout = true;
    expectCounts(hand,
                 {"numRejectedIncrementHold=1", "numRejectedIncrementHold=1 numRejectedKeloCallIncrement=1",
                  "numRejectedIncrementHold=1 numRejectedVolumeDecrement=1",
                  "numRejectedIncrementHold=1 numRejectedVolumeIncrement=1"});
}

TEST(EventStats, FirstFrameOfAHold) {
    HandStats hand = touching();
    hand.isHolding = true;
    expectCounts(hand, {"numBeginHold=1", "numBeginHold=1 numKeloCall=1",
                        "numBeginHold=1 numVolumeDecrement=1", "numBeginHold=1 numVolumeIncrement=1"});
}

TEST(EventStats, FirstFrameOfAHoldThatWasSuppressed) {
    HandStats hand = touching();
    hand.isHolding = hand.wasHoldSuppressed = true;
    expectCounts(hand, {"numBeginHold=1 numSuppressed2Holding=1",
                        "numBeginHold=1 numKeloCall=1 numSuppressed2Holding=1",
                        "numBeginHold=1 numVolumeDecrement=1 numSuppressed2Holding=1",
                        "numBeginHold=1 numVolumeIncrement=1 numSuppressed2Holding=1"});
}

TEST(EventStats, FurtherFrameOfAHold) {
    HandStats hand = touching();
    hand.isHolding = hand.wasHolding = true;
    expectCounts(hand,
                 {"numIncrementHold=1", "numIncrementHold=1 numKeloCallIncrement=1",
                  "numIncrementHold=1 numVolumeDecrement=1", "numIncrementHold=1 numVolumeIncrement=1"});
    hand.wasHoldSuppressed = true; // asked for on the first frame only
    expectCounts(hand,
                 {"numIncrementHold=1", "numIncrementHold=1 numKeloCallIncrement=1",
                  "numIncrementHold=1 numVolumeDecrement=1", "numIncrementHold=1 numVolumeIncrement=1"});
}

TEST(EventStats, AHoldDecidesBeforeEverythingAfterIt) {
    HandStats hand = touching();
    raiseEverything(hand);
    hand.isHoldSuppressed = hand.wasHoldSuppressed = hand.isPastHoldTimeout = hand.isTap = false;
    expectCounts(hand,
                 {"numIncrementHold=1", "numIncrementHold=1 numKeloCallIncrement=1",
                  "numIncrementHold=1 numVolumeDecrement=1", "numIncrementHold=1 numVolumeIncrement=1"});
    hand.wasHolding = false;
    expectCounts(hand, {"numBeginHold=1", "numBeginHold=1 numKeloCall=1",
                        "numBeginHold=1 numVolumeDecrement=1", "numBeginHold=1 numVolumeIncrement=1"});
}

TEST(EventStats, EndOfAHoldIsTheSameInEveryRegion) {
    HandStats hand = released();
    hand.wasHolding = true;
    expectCounts(hand, {"numEndHold=1", "numEndHold=1", "numEndHold=1", "numEndHold=1"});
}

TEST(EventStats, EndOfAHoldHidesTheTapOfItsFrame) {
    HandStats hand = released();
    hand.wasHolding = hand.wasPastHoldTimeout = hand.isTapCandidate = hand.isTap = true;
    expectCounts(hand, {"numEndHold=1", "numEndHold=1", "numEndHold=1", "numEndHold=1"});
    hand.isTap = false;
    expectCounts(hand, {"numEndHold=1", "numEndHold=1", "numEndHold=1", "numEndHold=1"});
}

TEST(EventStats, EndOfASuppressedHoldIsTheSameInEveryRegion) {
    HandStats hand = released();
    hand.wasPastHoldTimeout = true;
    expectCounts(hand, {"numRejectedEndHold=1", "numRejectedEndHold=1", "numRejectedEndHold=1",
                        "numRejectedEndHold=1"});
    hand.isTapCandidate = true;
    expectCounts(hand, {"numRejectedEndHold=1", "numRejectedEndHold=1", "numRejectedEndHold=1",
                        "numRejectedEndHold=1"});
    hand.isTap = true;
    expectCounts(hand, {"numRejectedEndHold=1", "numRejectedEndHold=1", "numRejectedEndHold=1",
                        "numRejectedEndHold=1"});
}

TEST(EventStats, RejectedTap) {
    HandStats hand = released();
    hand.isTapCandidate = true;
    expectCounts(hand,
                 {"numRejectedTap=1", "numRejectedTap=1 numRejectedPlayPause=1",
                  "numRejectedTap=1 numRejectedVolumeDown=1", "numRejectedTap=1 numRejectedVolumeUp=1"});
    hand.isPastHoldTimeout = hand.wasPastHoldTimeout = true; // no end: it stayed past the timeout
    expectCounts(hand,
                 {"numRejectedTap=1", "numRejectedTap=1 numRejectedPlayPause=1",
                  "numRejectedTap=1 numRejectedVolumeDown=1", "numRejectedTap=1 numRejectedVolumeUp=1"});
}

TEST(EventStats, Tap) {
    HandStats hand = released();
    hand.isTapCandidate = hand.isTap = true;
    expectCounts(hand, {"numTaps=1", "numTaps=1 numPlayPause=1", "numTaps=1 numVolumeDown=1",
                        "numTaps=1 numVolumeUp=1"});
    hand.isTapCandidate = false;
    expectCounts(hand, {"numTaps=1", "numTaps=1 numPlayPause=1", "numTaps=1 numVolumeDown=1",
                        "numTaps=1 numVolumeUp=1"});
}

TEST(EventStats, ATapThatIsMarkedRejectedCountsAsATap) {
    HandStats hand = released(); // as without tap suppression
    hand.isTapCandidate = hand.isTap = hand.isTapRejected = true;
    expectCounts(hand, {"numTaps=1", "numTaps=1 numPlayPause=1", "numTaps=1 numVolumeDown=1",
                        "numTaps=1 numVolumeUp=1"});
}

/// Updates with the frames in turn, all in one region.
std::string countedOver(const std::vector<HandStats> &frames, PixelRegion region) {
    EventStats stats;
    for (HandStats hand : frames) {
        hand.activeRegion = region;
        stats.update(hand);
    }
    return counted(stats);
}

HandStats touchBegins() {
    HandStats hand;
    hand.isTouching = true;
    return hand;
}

HandStats holdFrame(bool wasHolding) {
    HandStats hand = touching();
    hand.isHolding = hand.isPastHoldTimeout = true;
    hand.wasHolding = hand.wasPastHoldTimeout = wasHolding;
    return hand;
}

HandStats holdEnd() {
    HandStats hand = released();
    hand.wasHolding = hand.wasPastHoldTimeout = true;
    return hand;
}

HandStats suppressedFrame(bool further) {
    HandStats hand = touching();
    hand.isHoldSuppressed = hand.isPastHoldTimeout = true;
    hand.wasHoldSuppressed = hand.wasPastHoldTimeout = further;
    return hand;
}

HandStats recoveredFrame() {
    HandStats hand = holdFrame(false);
    hand.wasHoldSuppressed = hand.wasPastHoldTimeout = true;
    return hand;
}

HandStats tap() {
    HandStats hand = released();
    hand.isTapCandidate = hand.isTap = true;
    return hand;
}

TEST(EventStats, ATapOfOneFrameIsCountedOnItsRelease) {
    EXPECT_EQ(countedOver({touchBegins()}, kPixelRegionPlayPause), "");
    EXPECT_EQ(countedOver({touchBegins(), tap()}, kPixelRegionPlayPause), "numTaps=1 numPlayPause=1");
}

TEST(EventStats, AHoldOfFiveFramesCountsOneBeginFourIncrementsAndAnEnd) {
    const std::vector<HandStats> frames{touchBegins(),   touching(),      holdFrame(false), holdFrame(true),
                                        holdFrame(true), holdFrame(true), holdFrame(true),  holdEnd()};
    EXPECT_EQ(countedOver(frames, kPixelRegionVolumeUp),
              "numBeginHold=1 numIncrementHold=4 numEndHold=1 numVolumeIncrement=5");
    EXPECT_EQ(countedOver(frames, kPixelRegionVolumeDown),
              "numBeginHold=1 numIncrementHold=4 numEndHold=1 numVolumeDecrement=5");
    EXPECT_EQ(countedOver(frames, kPixelRegionPlayPause),
              "numBeginHold=1 numIncrementHold=4 numEndHold=1 numKeloCall=1 numKeloCallIncrement=4");
}

TEST(EventStats, ASuppressedHoldThatRecoversCountsBoth) {
    EXPECT_EQ(countedOver({touchBegins(), suppressedFrame(false), suppressedFrame(true),
                           suppressedFrame(true), recoveredFrame(), holdFrame(true), holdEnd()},
                          kPixelRegionVolumeDown),
              "numBeginHold=1 numIncrementHold=1 numEndHold=1 numVolumeDecrement=2 numRejectedBeginHold=1 "
              "numRejectedIncrementHold=2 numRejectedVolumeDecrement=3 numSuppressed2Holding=1");
}

TEST(EventStats, ASuppressedHoldEndsRejected) {
    HandStats end = released();
    end.wasHoldSuppressed = end.wasPastHoldTimeout = true;
    EXPECT_EQ(countedOver({touchBegins(), suppressedFrame(false), suppressedFrame(true), end},
                          kPixelRegionPlayPause),
              "numRejectedBeginHold=1 numRejectedIncrementHold=1 numRejectedEndHold=1 numRejectedKeloCall=1 "
              "numRejectedKeloCallIncrement=1");
}

/// Each counter at its own number, 1 to 24 in the order of declaration.
EventStats numberedCounters() {
    EventStats stats;
    for (std::size_t i = 0; i < kCounters.size(); ++i)
        stats.*kCounters[i].counter = i + 1;
    return stats;
}

TEST(EventStats, ResetClearsEveryCounter) {
    EventStats stats = numberedCounters();
    stats.Reset();
    EXPECT_EQ(counted(stats), "");
}

TEST(EventStats, CountersAreSixtyFourBitsWide) {
    EventStats stats;
    stats.numTaps = 4294967295u;
    HandStats hand = tap();
    stats.update(hand);
    EXPECT_EQ(stats.numTaps, 4294967296u);
}

TEST(EventStats, DictionaryFilesEachCounterUnderItsName) {
    using Dictionary = PropertyValue::Dictionary;
    const Dictionary dispatched{{"numTaps", 1u},
                                {"numBeginHold", 2u},
                                {"numIncrementHold", 3u},
                                {"numEndHold", 4u},
                                {"numVolumeUp", 5u},
                                {"numVolumeDown", 6u},
                                {"numPlayPause", 7u},
                                {"numKeloCall", 8u},
                                {"numKeloCallIncrement", 9u},
                                {"numVolumeIncrement", 10u},
                                {"numVolumeDecrement", 11u},
                                {"numHolding2Suppressed", 24u}}; // meant: it was a hold
    const Dictionary rejected{{"numRejectedTap", 12u},
                              {"numRejectedBeginHold", 13u},
                              {"numRejectedIncrementHold", 14u},
                              {"numRejectedEndHold", 15u},
                              {"numRejectedVolumeUp", 16u},
                              {"numRejectedVolumeDown", 17u},
                              {"numRejectedPlayPause", 18u},
                              {"numRejectedKeloCall", 19u},
                              {"numRejectedKeloCallIncrement", 20u},
                              {"numRejectedVolumeIncrement", 21u},
                              {"numRejectedVolumeDecrement", 22u},
                              {"numSuppressed2Holding", 23u}}; // meant: it was suppressed
    EXPECT_EQ(numberedCounters().statsDictionary(),
              PropertyValue(Dictionary{{"Dispatched", dispatched}, {"Rejected", rejected}}));
}

TEST(EventStats, DictionaryAfterResetHoldsTwentyFourZeros) {
    EventStats stats = numberedCounters();
    stats.Reset();
    const PropertyValue value = stats.statsDictionary();
    ASSERT_NE(value.asDictionary(), nullptr);
    EXPECT_EQ(value.asDictionary()->size(), 2u);
    for (const char *group : {"Dispatched", "Rejected"}) {
        ASSERT_NE(value.find(group), nullptr) << group;
        ASSERT_NE(value.find(group)->asDictionary(), nullptr) << group;
        EXPECT_EQ(value.find(group)->asDictionary()->size(), 12u) << group;
        for (const auto &[name, number] : *value.find(group)->asDictionary())
            EXPECT_EQ(number, PropertyValue(0u)) << name;
    }
}

} // namespace
} // namespace ZorvaTouch
