#include "Host/Simulated/FeatureReports.h"

#include "Shared/InputReport.h"
#include "Shared/Util/Bytes.h"

#include <algorithm>
#include <utility>

namespace ZorvaTouch::Simulated {
namespace {

using Bytes = std::vector<std::uint8_t>;
using FeatureReport::FactoryResetHoldDuration;

constexpr std::uint8_t kDebugReports[] = {0x04, 0x10, 0x11, 0x13, 0x1D, 0x32, 0x3C, 0x3F};
constexpr std::uint8_t kRefusedDebugReports[] = {0x12, 0x3B};
constexpr std::uint32_t kFactoryResetHoldDuration = 10000;

Bytes holdDurationReport() {
    Bytes report(FactoryResetHoldDuration::kReportLength);
    report[0] = FactoryResetHoldDuration::kReportId;
    Util::storeLittle32(&report[1], kFactoryResetHoldDuration);
    return report;
}

} // namespace

FeatureReports FeatureReports::ofDevice() {
    FeatureReports reports;
    for (const std::uint8_t id : kDebugReports)
        reports.answer(id, {id, 1, 2, 3, 4});
    for (const std::uint8_t id : kRefusedDebugReports)
        reports.fail(id, ZORVA_STATUS_UNSUPPORTED);
    reports.answer(FactoryResetHoldDuration::kReportId, holdDurationReport());
    return reports;
}

void FeatureReports::answer(std::uint32_t reportId, Bytes report) {
    _answers.insert_or_assign(reportId, std::move(report));
}

void FeatureReports::fail(std::uint32_t reportId, ZorvaStatus status) {
    _answers.insert_or_assign(reportId, status);
}

ZorvaStatus FeatureReports::read(std::uint32_t reportId, std::span<std::uint8_t> buffer,
                                 std::size_t &stored) const noexcept {
    stored = 0;
    const auto found = _answers.find(reportId);
    if (found == _answers.end())
        return ZORVA_STATUS_UNSUPPORTED;
    if (const ZorvaStatus *const status = std::get_if<ZorvaStatus>(&found->second))
        return *status;
    const Bytes &report = *std::get_if<Bytes>(&found->second);
    stored = std::min(report.size(), buffer.size());
    std::copy_n(report.begin(), stored, buffer.begin());
    return ZORVA_STATUS_SUCCESS;
}

} // namespace ZorvaTouch::Simulated
