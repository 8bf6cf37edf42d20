#pragma once

#include "Bench/Reference/Hand.h"
#include "Shared/Util/PropertyValue.h"

#include <map>
#include <string>

namespace ZorvaTouch::Reference {

/// What was dispatched and what was rejected since the last reset.
class Counters {
public:
    Counters() { reset(); }

    void reset();
    void update(const Hand &hand);

    /// Two dictionaries of twelve numbers, "Dispatched" and "Rejected".
    [[nodiscard]] PropertyValue dictionary() const;

private:
    struct Counts {
        std::uint64_t taps = 0, beginHold = 0, incrementHold = 0, endHold = 0;
        std::uint64_t volumeUp = 0, volumeDown = 0, playPause = 0;
        std::uint64_t keloCall = 0, keloCallIncrement = 0, volumeIncrement = 0, volumeDecrement = 0;
        std::uint64_t changedSides = 0; ///< holds that became suppressed holds, or the other way about
    };

    void countSuppressedHold(const Hand &hand);
    void countHold(const Hand &hand);

    Counts _dispatched;
    Counts _rejected;
};

} // namespace ZorvaTouch::Reference
