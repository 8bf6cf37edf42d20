#include "Synth/Reports.h"

#include "Shared/InputReport.h"

namespace ZorvaTouch::Synth {

std::vector<std::uint8_t> imageReport(std::uint32_t frameNumber, std::uint32_t timeMs,
                                      const SensorModel::RawCounts &rawCounts,
                                      const Baseline::Signals &signals) {
    const InputReport::Image image{.frameNumber = frameNumber,
                                   .timeMs = timeMs,
                                   .flags = {},
                                   .rawCounts = rawCounts,
                                   .signals = signals};
    const auto report = image.toReport();
    return {report.begin(), report.end()};
}

std::vector<std::uint8_t> resetReport() {
    std::vector<std::uint8_t> report(InputReport::FirmwareEvent::kReportLength);
    report[0] = InputReport::FirmwareEvent::kReportId;
    report[1] = InputReport::FirmwareEvent::kDeviceReset;
    return report;
}

} // namespace ZorvaTouch::Synth
