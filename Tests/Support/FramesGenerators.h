#pragma once

#include "Shared/Frame.h"
#include "Shared/Util/PropertyValue.h"
#include "Tests/Support/FramesScript.h"

#include <rapidcheck.h>

#include <cstdint>
#include <iosfwd>
#include <string>
#include <vector>

namespace ZorvaTouch {

// How a counterexample is printed.
void showValue(const PropertyValue &value, std::ostream &os);
void showValue(const Frame &frame, std::ostream &os);

/// What properties are checked on.
namespace Scripted {

/// The generator's full range, however small the case is: ranges shrink with the case's size otherwise.
template <typename T> [[nodiscard]] rc::Gen<T> fullRange(rc::Gen<T> generator) {
    return rc::gen::resize(rc::kNominalSize, std::move(generator));
}

/// A vector of up to `maxCount` elements, each of full range.
template <typename T> [[nodiscard]] rc::Gen<std::vector<T>> upTo(int maxCount, rc::Gen<T> element) {
    return rc::gen::resize(maxCount, rc::gen::container<std::vector<T>>(fullRange(std::move(element))));
}

/// One image's worth of input.
struct SensorFrame {
    std::uint32_t timeMs = 0;
    Electrodes signals{};
};
void showValue(const SensorFrame &frame, std::ostream &os);

/// One finger's visit: it rises over two frames, stays, and falls again.
struct FingerVisit {
    int electrode = 0;      ///< where its centre is, 0 to 14
    int counts = 0;         ///< at its centre, at its strongest
    int neighbourShare = 0; ///< percent of it that the next electrodes up and down see
    int frames = 1;         ///< how long it stays
    int drift = 0;          ///< after so many frames its centre moves on by one electrode; 0 never
    int gapFrames = 1;      ///< frames without a finger afterwards
    int intervalMs = 10;    ///< between frames
};
void showValue(const FingerVisit &visit, std::ostream &os);

[[nodiscard]] rc::Gen<std::vector<FingerVisit>> fingerVisits();

/// The frames of the visits, one after the other, with time that only runs forward, and two empty ones at the
/// end.
[[nodiscard]] std::vector<SensorFrame> framesOf(const std::vector<FingerVisit> &visits);

/// Frames of any content, at any times.
[[nodiscard]] rc::Gen<std::vector<SensorFrame>> anySensorFrames();

/// A write of a recognizer's key, in the pipeline's domain, with a value of any kind.
struct KeyWrite {
    std::string key;
    PropertyValue value;
};
void showValue(const KeyWrite &write, std::ostream &os);

[[nodiscard]] rc::Gen<KeyWrite> keyWrite();

/// Well-formed UTF-8, control characters and the far planes included.
[[nodiscard]] rc::Gen<std::string> text();

/// Values that JSON can hold, null only inside others.
[[nodiscard]] rc::Gen<PropertyValue> jsonValue();

/// Frames that can be written and read back.
[[nodiscard]] rc::Gen<std::vector<Frame>> anyFrames();

/// Frames whose keys, values and times often coincide, for trimming and sorting.
[[nodiscard]] rc::Gen<Frame> crowdedFrame();

} // namespace Scripted
} // namespace ZorvaTouch
