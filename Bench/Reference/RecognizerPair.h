#pragma once

#include "Bench/Reference/ReferenceRecognizer.h"
#include "Shared/Algs.h"
#include "Shared/Frame.h"
#include "Shared/HostEvent.h"
#include "Shared/InputReport.h"

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ZorvaTouch::Reference {

/// The real recognizer and the plain one, fed alike and compared after every step.
class RecognizerPair {
public:
    RecognizerPair();

    // Each feeds both and compares the events and both descriptions.
    void handleImage(const InputReport::Image &image);
    void handleReset();
    /// Writes a state, `key` without the recognizer's domain. There is nothing to compare until the next
    /// frame.
    void setState(const std::string &key, const PropertyValue &value);
    /// Plays one recorded frame as a pipeline would: images, device resets and the recognizer's states count.
    void handleFrame(const FrameView &frame);
    /// Compares every state that can be read, the counters among them.
    void compareStates();

    /// The first difference: where it was and both texts. Empty as long as there is none; what comes after
    /// the first is not looked at.
    [[nodiscard]] const std::string &difference() const { return _difference; }

    /// The events of the last frame as JSON lines.
    [[nodiscard]] const std::string &events() const { return _events; }
    /// The gesture phrase of the last frame, "TAP 30ms ActiveRegion=1 BELOWNOISE".
    [[nodiscard]] std::string phrase() const;

private:
    void compareFrame(const HostEventList &events, const HostEventList &referenceEvents,
                      std::span<const std::int16_t, kElectrodeCount> values, std::uint32_t timeMs);
    void compare(std::string_view what, const std::string &text, const std::string &referenceText);

    Algs _algs;
    Recognizer _reference;
    std::uint64_t _frameCount = 0;
    std::string _events;
    std::string _touchDescription;
    std::string _difference;
};

/// A batch as JSON, one event a line.
[[nodiscard]] std::string jsonLines(const HostEventList &events);

/// Feeds images to a pair. @return The first difference, empty if there is none.
[[nodiscard]] std::string differenceOn(const std::vector<InputReport::Image> &images);

} // namespace ZorvaTouch::Reference
