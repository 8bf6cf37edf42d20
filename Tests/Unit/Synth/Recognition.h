#pragma once

#include "Shared/FrameList.h"

#include <cstddef>
#include <map>
#include <string>

namespace ZorvaTouch::Test {

/// What the recognizer made of the contacts of one kind.
struct Outcomes {
    std::size_t labels = 0;
    std::size_t right = 0;        ///< the gesture in the region; of an accident: no gesture
    std::size_t wrongRegion = 0;  ///< the gesture elsewhere
    std::size_t wrongGesture = 0; ///< another gesture; of an accident: any
    std::size_t nothing = 0;      ///< no gesture where one was meant
};

/// What the recognizer, with its defaults, made of a recording.
struct Recognition {
    std::map<std::string, Outcomes> byKind; ///< by the labels' kind
    std::size_t stray = 0;                  ///< gestures without a label, or more than their label asks for
};

/// Replays a recording and matches gestures with labels by the sensor's time.
///
/// Gestures are taps, hold starts and hold changes. One belongs to a label from its "StartMs" to 60 ms after
/// its "EndMs", and to one label at most: those that mean something choose first, in order of time. Resets
/// part the recording: labels and gestures on different sides have nothing to do with each other.
[[nodiscard]] Recognition recognize(const FrameList &frames);

} // namespace ZorvaTouch::Test
