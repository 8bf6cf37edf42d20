#pragma once

#include "Shared/Util/PropertyValue.h"
#include "Synth/Clock.h"
#include "Synth/Contact.h"

#include <vector>

/// Ground truth that travels in a recording: metadata under `kLabelKey`, each
/// {"Kind": string, "Region": code, "StartMs": sensor time, "EndMs": sensor time}.
namespace ZorvaTouch::Synth {

inline constexpr const char *kLabelKey = "Label";

/// The labels of a contact that is over: its own, and a "Slide" for each time it moved to another region.
///
/// "Region" is a `PixelRegion` code; 0 marks what happens by accident and should give no gesture. All times
/// are of the sensor's clock since the last reset; what came before it is left out.
///
/// @param end    When it was over: its end, or a reset of the device in the middle of it.
/// @param clock  As it was until then.
[[nodiscard]] std::vector<PropertyValue> labelsOf(const Contact &contact, Microseconds end,
                                                  const Clock &clock);

} // namespace ZorvaTouch::Synth
