#include "Bench/Reference/Counters.h"

namespace ZorvaTouch::Reference {

void Counters::reset() {
    _dispatched = {};
    _rejected = {};
}

void Counters::update(const Hand &hand) {
    if (hand.isTouching && !hand.wasTouching)
        return;
    if (hand.isHoldSuppressed)
        return countSuppressedHold(hand);
    if (hand.isHolding)
        return countHold(hand);
    if (hand.wasHolding) {
        ++_dispatched.endHold;
        return;
    }
    if (!hand.isPastHoldTimeout && hand.wasPastHoldTimeout) {
        ++_rejected.endHold;
        return;
    }
    if (!hand.isTap && !hand.isTapCandidate)
        return;

    Counts &counts = hand.isTap ? _dispatched : _rejected;
    ++counts.taps;
    if (hand.activeRegion == kRegionPlayPause)
        ++counts.playPause;
    else if (hand.activeRegion == kRegionVolumeDown)
        ++counts.volumeDown;
    else if (hand.activeRegion == kRegionVolumeUp)
        ++counts.volumeUp;
}

void Counters::countSuppressedHold(const Hand &hand) {
    if (hand.wasHolding)
        ++_dispatched.changedSides;

    const bool isPast = hand.isPastHoldTimeout;
    if (isPast && hand.wasPastHoldTimeout)
        ++_rejected.incrementHold;
    else if (isPast)
        ++_rejected.beginHold;

    if (hand.activeRegion == kRegionVolumeDown)
        ++_rejected.volumeDecrement;
    else if (hand.activeRegion == kRegionVolumeUp)
        ++_rejected.volumeIncrement;
    else if (hand.activeRegion == kRegionPlayPause && isPast)
        ++(hand.wasPastHoldTimeout ? _rejected.keloCallIncrement : _rejected.keloCall);
}

void Counters::countHold(const Hand &hand) {
    const bool isPlayPause = hand.activeRegion == kRegionPlayPause;
    if (hand.wasHolding) {
        ++_dispatched.incrementHold;
        if (isPlayPause)
            ++_dispatched.keloCallIncrement;
    } else {
        if (hand.wasHoldSuppressed)
            ++_rejected.changedSides;
        ++_dispatched.beginHold;
        if (isPlayPause)
            ++_dispatched.keloCall;
    }
    if (hand.activeRegion == kRegionVolumeDown)
        ++_dispatched.volumeDecrement;
    else if (hand.activeRegion == kRegionVolumeUp)
        ++_dispatched.volumeIncrement;
}

PropertyValue Counters::dictionary() const {
    const PropertyValue::Dictionary dispatched{
        {"numTaps", _dispatched.taps},
        {"numBeginHold", _dispatched.beginHold},
        {"numIncrementHold", _dispatched.incrementHold},
        {"numEndHold", _dispatched.endHold},
        {"numHolding2Suppressed", _dispatched.changedSides},
        {"numVolumeUp", _dispatched.volumeUp},
        {"numVolumeIncrement", _dispatched.volumeIncrement},
        {"numVolumeDown", _dispatched.volumeDown},
        {"numVolumeDecrement", _dispatched.volumeDecrement},
        {"numPlayPause", _dispatched.playPause},
        {"numKeloCall", _dispatched.keloCall},
        {"numKeloCallIncrement", _dispatched.keloCallIncrement},
    };
    const PropertyValue::Dictionary rejected{
        {"numRejectedTap", _rejected.taps},
        {"numRejectedBeginHold", _rejected.beginHold},
        {"numRejectedIncrementHold", _rejected.incrementHold},
        {"numRejectedEndHold", _rejected.endHold},
        {"numSuppressed2Holding", _rejected.changedSides},
        {"numRejectedVolumeUp", _rejected.volumeUp},
        {"numRejectedVolumeIncrement", _rejected.volumeIncrement},
        {"numRejectedVolumeDown", _rejected.volumeDown},
        {"numRejectedVolumeDecrement", _rejected.volumeDecrement},
        {"numRejectedPlayPause", _rejected.playPause},
        {"numRejectedKeloCall", _rejected.keloCall},
        {"numRejectedKeloCallIncrement", _rejected.keloCallIncrement},
    };
    return PropertyValue::Dictionary{{"Dispatched", dispatched}, {"Rejected", rejected}};
}

} // namespace ZorvaTouch::Reference
