#include "Tests/Kernel/FeatureAnswers.h"

#include "Shared/InputReport.h"
#include "Shared/Util/Bytes.h"
#include "Shared/Util/Hex.h"
#include "Tests/Kernel/Numbers.h"

#include <stdexcept>
#include <string>

namespace ZorvaTouch::KernelTests {
namespace {

using FeatureReport::FactoryResetHoldDuration;

constexpr std::uint8_t kDebugReports[] = {0x04, 0x10, 0x11, 0x13, 0x1D, 0x32, 0x3C, 0x3F};
constexpr std::uint8_t kRefusedReports[] = {0x12, 0x3B};
constexpr std::uint32_t kHoldDuration = 10000;

std::vector<std::uint8_t> holdReport() {
    std::vector<std::uint8_t> report(FactoryResetHoldDuration::kReportLength);
    report[0] = FactoryResetHoldDuration::kReportId;
    Util::storeLittle32(&report[1], kHoldDuration);
    return report;
}

std::vector<std::uint8_t> debugReport(std::uint8_t id) { return {id, 1, 2, 3, 4}; }

FeatureAnswers::Mode modeNamed(std::string_view name) {
    using Mode = FeatureAnswers::Mode;
    for (const Mode mode : {Mode::Answer, Mode::Refuse, Mode::Mute})
        if (name == nameOf(mode))
            return mode;
    throw std::invalid_argument("neither answer, refuse nor mute: " + std::string(name));
}

} // namespace

FeatureAnswers::FeatureAnswers() {
    for (const std::uint8_t id : kDebugReports)
        _answers[id] = {Mode::Answer, debugReport(id)};
    for (const std::uint8_t id : kRefusedReports)
        _answers[id] = {Mode::Refuse, debugReport(id)};
    _answers[FactoryResetHoldDuration::kReportId] = {Mode::Answer, holdReport()};
}

void FeatureAnswers::change(std::string_view text) {
    const std::size_t sign = text.find('=');
    if (sign == std::string_view::npos)
        throw std::invalid_argument("not ID=MODE: " + std::string(text));
    const std::uint32_t id = numberFrom(text.substr(0, sign));
    if (id > UINT8_MAX)
        throw std::invalid_argument("no report ID: " + std::string(text));
    const std::string_view rest = text.substr(sign + 1);
    const std::size_t colon = rest.find(':');
    const auto [found, isNew] = _answers.try_emplace(static_cast<std::uint8_t>(id));
    Answer &answer = found->second;
    if (isNew)
        answer.report = debugReport(found->first);
    answer.mode = modeNamed(rest.substr(0, colon));
    if (colon != std::string_view::npos)
        answer.report = Util::bytesFromHexString(rest.substr(colon + 1));
}

const FeatureAnswers::Answer &FeatureAnswers::of(std::uint8_t reportId) const {
    const auto found = _answers.find(reportId);
    return found == _answers.end() ? _refusal : found->second;
}

const char *nameOf(FeatureAnswers::Mode mode) noexcept {
    switch (mode) {
    case FeatureAnswers::Mode::Answer:
        return "answer";
    case FeatureAnswers::Mode::Refuse:
        return "refuse";
    case FeatureAnswers::Mode::Mute:
        break;
    }
    return "mute";
}

} // namespace ZorvaTouch::KernelTests
