#include "Synth/Reports.h"

#include "Shared/InputReport.h"
#include "Shared/Util/Bytes.h"

namespace ZorvaTouch::Synth {
namespace {

// Offsets in an image report, bytes; the flags between time and raw counts stay 0.
constexpr std::size_t kFrameNumberAt = 1;
constexpr std::size_t kTimeAt = 5;
constexpr std::size_t kRawCountsAt = 13;
constexpr std::size_t kSignalsAt = 43;

} // namespace

std::vector<std::uint8_t> imageReport(std::uint32_t frameNumber, std::uint32_t timeMs,
                                      const SensorModel::RawCounts &rawCounts,
                                      const Baseline::Signals &signals) {
    std::vector<std::uint8_t> report(InputReport::Image::kReportLength);
    report[0] = InputReport::Image::kReportId;
    Util::storeLittle32(&report[kFrameNumberAt], frameNumber);
    Util::storeLittle32(&report[kTimeAt], timeMs);
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        Util::storeLittle16(&report[kRawCountsAt + 2 * i], rawCounts[i]);
        Util::storeLittle16(&report[kSignalsAt + 2 * i], static_cast<std::uint16_t>(signals[i]));
    }
    return report;
}

std::vector<std::uint8_t> resetReport() {
    std::vector<std::uint8_t> report(InputReport::FirmwareEvent::kReportLength);
    report[0] = InputReport::FirmwareEvent::kReportId;
    report[1] = InputReport::FirmwareEvent::kDeviceReset;
    return report;
}

} // namespace ZorvaTouch::Synth
