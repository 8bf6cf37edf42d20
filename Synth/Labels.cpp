#include "Synth/Labels.h"

#include <algorithm>
#include <string>

namespace ZorvaTouch::Synth {
namespace {

constexpr std::string_view kSlideKind = "Slide";

PropertyValue label(std::string_view kind, PixelRegion region, std::uint32_t startMs, std::uint32_t endMs) {
    return PropertyValue::Dictionary{{"Kind", kind},
                                     {"Region", static_cast<std::uint32_t>(region)},
                                     {"StartMs", startMs},
                                     {"EndMs", endMs}};
}

} // namespace

std::vector<PropertyValue> labelsOf(const Contact &contact, Microseconds end, const Clock &clock) {
    const PixelRegion region =
        contact.kind == ContactKind::Remainder ? kPixelRegionNone : contact.stops[0].region;
    const Microseconds start = std::max(contact.start, clock.lastReset());
    std::vector<PropertyValue> labels{
        label(nameOf(contact.kind), region, clock.sensorMs(start), clock.sensorMs(end))};
    if (region == kPixelRegionNone)
        return labels;
    for (std::size_t i = 1; i < contact.stopCount; ++i) {
        const Microseconds departure = contact.start + contact.stops[i - 1].departure;
        const Microseconds arrival = std::min(contact.start + contact.stops[i].arrival, end);
        if (departure < end)
            labels.push_back(label(kSlideKind, contact.stops[i].region, clock.sensorMs(departure),
                                   clock.sensorMs(arrival)));
    }
    return labels;
}

} // namespace ZorvaTouch::Synth
