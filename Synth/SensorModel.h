#pragma once

#include "Shared/InputReport.h"
#include "Synth/Contact.h"
#include "Synth/Parameters.h"
#include "Synth/Random.h"

#include <array>
#include <cstdint>
#include <span>

namespace ZorvaTouch::Synth {

/// Part of each electrode's largest signal, 0 to 1 per contact, index 0 = electrode A.
using Coverage = std::array<double, kElectrodeCount>;

/// How far contacts cover the electrodes: over each pad the mean of the blobs' heights, over two pads their
/// sum (a finger on one of two pads gives the electrode's whole signal).
[[nodiscard]] Coverage coverageOf(std::span<const Blob> blobs) noexcept;

/// One particular sensor: what its converters read.
///
///     raw = offset + drift - warming + signal x coverage x gain + noise + common noise
///
/// in counts, rounded to an integer and kept within 16 bits. Gains and offsets belong to the sensor, that is
/// to the generator it is made with.
class SensorModel {
public:
    using RawCounts = std::array<std::uint16_t, kElectrodeCount>;

    SensorModel(const Parameters &parameters, Random random) noexcept;

    /// Measures all electrodes once.
    /// @param seconds  Since the last measurement.
    [[nodiscard]] RawCounts measure(std::span<const Blob> blobs, double seconds) noexcept;

private:
    /// What one electrode is and has become.
    struct Electrode {
        double gain = 0;   ///< counts at coverage 1, for each count of `signal`
        double offset = 0; ///< counts
        double drift = 0;  ///< counts; wanders about 0
        double warmth = 0; ///< coverage, smoothed over `warmTime`
    };

    void drift(Electrode &electrode, double coverage, double seconds) noexcept;

    Parameters _parameters;
    Random _noise;
    std::array<Electrode, kElectrodeCount> _electrodes;
};

} // namespace ZorvaTouch::Synth
