#include "Shared/EventStats.h"

#include "Shared/HandStats.h"

#include <array>

namespace ZorvaTouch {
namespace {

struct NamedCounter {
    const char *name;
    std::uint64_t EventStats::*counter;
};
#define ZORVA_COUNTER(name)                                                                                  \
    NamedCounter { #name, &EventStats::name }

constexpr std::array kDispatched{ZORVA_COUNTER(numTaps),
                                 ZORVA_COUNTER(numBeginHold),
                                 ZORVA_COUNTER(numIncrementHold),
                                 ZORVA_COUNTER(numEndHold),
                                 ZORVA_COUNTER(numHolding2Suppressed), // filed here on purpose: it was a hold
                                 ZORVA_COUNTER(numVolumeUp),
                                 ZORVA_COUNTER(numVolumeIncrement),
                                 ZORVA_COUNTER(numVolumeDown),
                                 ZORVA_COUNTER(numVolumeDecrement),
                                 ZORVA_COUNTER(numPlayPause),
                                 ZORVA_COUNTER(numKeloCall),
                                 ZORVA_COUNTER(numKeloCallIncrement)};

constexpr std::array kRejected{
    ZORVA_COUNTER(numRejectedTap),
    ZORVA_COUNTER(numRejectedBeginHold),
    ZORVA_COUNTER(numRejectedIncrementHold),
    ZORVA_COUNTER(numRejectedEndHold),
    ZORVA_COUNTER(numSuppressed2Holding), // filed here on purpose: it was suppressed
    ZORVA_COUNTER(numRejectedVolumeUp),
    ZORVA_COUNTER(numRejectedVolumeIncrement),
    ZORVA_COUNTER(numRejectedVolumeDown),
    ZORVA_COUNTER(numRejectedVolumeDecrement),
    ZORVA_COUNTER(numRejectedPlayPause),
    ZORVA_COUNTER(numRejectedKeloCall),
    ZORVA_COUNTER(numRejectedKeloCallIncrement)};

#undef ZORVA_COUNTER

/// A counter for each region; the ones that count nothing are null.
using RegionCounters = std::array<std::uint64_t EventStats::*, kPixelRegionCount>;

constexpr RegionCounters byRegion(std::uint64_t EventStats::*playPause, std::uint64_t EventStats::*volumeDown,
                                  std::uint64_t EventStats::*volumeUp) {
    return {nullptr, playPause, volumeDown, volumeUp}; // in the order of PixelRegion
}

constexpr RegionCounters kTaps =
    byRegion(&EventStats::numPlayPause, &EventStats::numVolumeDown, &EventStats::numVolumeUp);
constexpr RegionCounters kRejectedTaps = byRegion(
    &EventStats::numRejectedPlayPause, &EventStats::numRejectedVolumeDown, &EventStats::numRejectedVolumeUp);
constexpr RegionCounters kHoldBegins =
    byRegion(&EventStats::numKeloCall, &EventStats::numVolumeDecrement, &EventStats::numVolumeIncrement);
constexpr RegionCounters kHoldFrames = byRegion(
    &EventStats::numKeloCallIncrement, &EventStats::numVolumeDecrement, &EventStats::numVolumeIncrement);
constexpr RegionCounters kSuppressedBegins =
    byRegion(&EventStats::numRejectedKeloCall, &EventStats::numRejectedVolumeDecrement,
             &EventStats::numRejectedVolumeIncrement);
constexpr RegionCounters kSuppressedFrames =
    byRegion(&EventStats::numRejectedKeloCallIncrement, &EventStats::numRejectedVolumeDecrement,
             &EventStats::numRejectedVolumeIncrement);
constexpr RegionCounters kStaleSuppressedFrames =
    byRegion(nullptr, &EventStats::numRejectedVolumeDecrement, &EventStats::numRejectedVolumeIncrement);

void count(EventStats &stats, const RegionCounters &counters, PixelRegion region) noexcept {
    if (const auto counter = counters[region])
        ++(stats.*counter);
}

template <std::size_t N>
PropertyValue dictionaryOf(const EventStats &stats, const std::array<NamedCounter, N> &counters) {
    PropertyValue::Dictionary dictionary;
    for (const NamedCounter &entry : counters)
        dictionary.emplace(entry.name, stats.*entry.counter);
    return dictionary;
}
static_assert(kDispatched.size() == 12 && kRejected.size() == 12);

} // namespace

void EventStats::update(const HandStats &hand) noexcept {
    const bool touchBegins = hand.isTouching && !hand.wasTouching;
    const bool suppressedHoldEnds = !hand.isPastHoldTimeout && hand.wasPastHoldTimeout;
    // The first that applies decides.
    if (touchBegins)
        return;
    if (hand.isHoldSuppressed)
        countSuppressedFrame(hand);
    else if (hand.isHolding)
        countHoldFrame(hand);
    else if (hand.wasHolding)
        ++numEndHold;
    else if (suppressedHoldEnds)
        ++numRejectedEndHold;
    else if (hand.isTapCandidate && !hand.isTap)
        countRejectedTap(hand);
    else if (hand.isTap)
        countTap(hand);
}

void EventStats::countSuppressedFrame(const HandStats &hand) noexcept {
    if (hand.wasHolding)
        ++numHolding2Suppressed;
    if (!hand.isPastHoldTimeout) {
        // The flag was left over when hold suppression was switched off; no begin is counted for it, on
        // purpose.
        count(*this, kStaleSuppressedFrames, hand.activeRegion);
    } else if (hand.wasPastHoldTimeout) {
        ++numRejectedIncrementHold;
        count(*this, kSuppressedFrames, hand.activeRegion);
    } else {
        ++numRejectedBeginHold;
        count(*this, kSuppressedBegins, hand.activeRegion);
    }
}

void EventStats::countHoldFrame(const HandStats &hand) noexcept {
    if (hand.wasHolding) {
        ++numIncrementHold;
        count(*this, kHoldFrames, hand.activeRegion);
        return;
    }
    if (hand.wasHoldSuppressed)
        ++numSuppressed2Holding;
    ++numBeginHold;
    count(*this, kHoldBegins, hand.activeRegion);
}

void EventStats::countRejectedTap(const HandStats &hand) noexcept {
    ++numRejectedTap;
    count(*this, kRejectedTaps, hand.activeRegion);
}

void EventStats::countTap(const HandStats &hand) noexcept {
    ++numTaps;
    count(*this, kTaps, hand.activeRegion);
}

PropertyValue EventStats::statsDictionary() const {
    return PropertyValue::Dictionary{{"Dispatched", dictionaryOf(*this, kDispatched)},
                                     {"Rejected", dictionaryOf(*this, kRejected)}};
}

} // namespace ZorvaTouch
