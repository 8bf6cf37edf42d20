#pragma once

#include "Shared/InputReport.h"
#include "Synth/Parameters.h"
#include "Synth/SensorModel.h"

#include <array>
#include <cstdint>

namespace ZorvaTouch::Synth {

/// The device's own idea of its untouched electrodes: what its firmware takes from raw counts to get signals.
///
/// After a reset the baseline is the mean of what is measured first, be it touched or not. Later an
/// electrode's baseline follows it slowly while its signal is within the touch band, quickly below the band,
/// and not at all above. So a finger that lies on the sensor during a reset vanishes, and leaves a negative
/// signal for a moment when it is lifted.
class Baseline {
public:
    using Signals = std::array<std::int16_t, kElectrodeCount>;

    explicit Baseline(const Parameters &parameters) noexcept : _parameters(parameters) {}

    void reset() noexcept { _measurements = 0; }

    /// Takes the next measurement.
    /// @param seconds  Since the last one.
    /// @return Raw counts less the baseline as it is afterwards, rounded and kept within 16 bits.
    [[nodiscard]] Signals update(const SensorModel::RawCounts &raw, double seconds) noexcept;

private:
    /// Part of the signal that the baseline takes over.
    [[nodiscard]] double shareOf(double signal, double seconds) const noexcept;

    Parameters _parameters;
    std::array<double, kElectrodeCount> _levels{};
    double _measurements = 0; ///< since the reset; stops growing when the mean is made
};

} // namespace ZorvaTouch::Synth
