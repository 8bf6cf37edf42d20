#pragma once

#include "Bench/Reference/Channels.h"
#include "Bench/Reference/Counters.h"
#include "Bench/Reference/Hand.h"
#include "Shared/HostEvent.h"
#include "Shared/InputReport.h"
#include "Shared/Util/PropertyValue.h"

#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <vector>

namespace ZorvaTouch::Reference {

/// One frame's touch signals, index order A to O.
using Signals = std::span<const std::int16_t, kElectrodeCount>;

/// The recognizer written straight down; it answers like `Algs`, text for text.
class Recognizer {
public:
    Recognizer();

    [[nodiscard]] HostEventList handleImage(const InputReport::Image &image);
    [[nodiscard]] HostEventList handleReset();

    /// @param key  Without the recognizer's domain.
    [[nodiscard]] PropertyValue getState(const std::string &key) const;
    void setState(const std::string &key, const PropertyValue &value);

    [[nodiscard]] std::string touchStateDescription(Signals values, std::uint32_t timeMs) const;
    [[nodiscard]] std::string virtualStateDescription(Signals values, std::uint32_t timeMs) const;

private:
    void processTouchFrame(Signals values, std::uint32_t frameNumber, std::uint32_t timeMs,
                           HostEventList &events);
    [[nodiscard]] std::shared_ptr<HostEvent> decideEvent();
    void reset();

    std::vector<Pixel> _pixels;
    VirtualImage _virtualImage;
    std::vector<VirtualPixel> _virtualPixels;
    Hand _hand;
    Counters _counters;
    std::uint16_t _lastEventPhase = 0;
};

} // namespace ZorvaTouch::Reference
