#pragma once

#include "Synth/Baseline.h"
#include "Synth/SensorModel.h"

#include <cstdint>
#include <vector>

/// The device's reports as bytes, report ID first. Shared/InputReport.h has the layouts.
namespace ZorvaTouch::Synth {

[[nodiscard]] std::vector<std::uint8_t> imageReport(std::uint32_t frameNumber, std::uint32_t timeMs,
                                                    const SensorModel::RawCounts &rawCounts,
                                                    const Baseline::Signals &signals);

/// The firmware event that says that the device has reset.
[[nodiscard]] std::vector<std::uint8_t> resetReport();

} // namespace ZorvaTouch::Synth
