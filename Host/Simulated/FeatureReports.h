#pragma once

#include "Plugin/ZorvaPlugIn.h"

#include <cstddef>
#include <cstdint>
#include <map>
#include <span>
#include <variant>
#include <vector>

namespace ZorvaTouch::Simulated {

/// What a device answers to requests for its feature reports: by report ID, bytes or a status. To any other
/// ID it answers that it has none: ZORVA_STATUS_UNSUPPORTED.
///
/// Threads: no lock of its own; the owner's.
class FeatureReports {
public:
    /// The debug reports 04, 10, 11, 13, 1d, 32, 3c and 3f, of five bytes each: the ID and 01 02 03 04; 12
    /// and 3b, which the device knows and refuses as unsupported; and 1f, how long the factory-reset gesture
    /// must be held: 10000, as 32 bits little-endian.
    [[nodiscard]] static FeatureReports ofDevice();

    /// @param report  The whole report, report ID first.
    void answer(std::uint32_t reportId, std::vector<std::uint8_t> report);
    void fail(std::uint32_t reportId, ZorvaStatus status);

    /// Stores a report as far as it fits.
    /// @param stored  Gets the number of bytes stored; 0 if there is no report.
    [[nodiscard]] ZorvaStatus read(std::uint32_t reportId, std::span<std::uint8_t> buffer,
                                   std::size_t &stored) const noexcept;

private:
    using Answer = std::variant<std::vector<std::uint8_t>, ZorvaStatus>;
    std::map<std::uint32_t, Answer> _answers;
};

} // namespace ZorvaTouch::Simulated
