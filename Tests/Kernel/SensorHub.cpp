#include "Tests/Kernel/SensorHub.h"

#include "Shared/Util/Bytes.h"

#include <algorithm>
#include <tuple>

namespace ZorvaTouch::KernelTests {
namespace {

constexpr std::uint8_t kReportId = 1;
constexpr std::uint8_t kReportsAll = 2, kFullPower = 2;
constexpr std::uint64_t kNanosecondsPerMs = 1'000'000;

} // namespace

SensorHub::FeatureReport SensorHub::featureReport() const noexcept {
    FeatureReport report{kReportId, _reporting, _power};
    Util::storeLittle32(&report[3], _intervalMs);
    Util::storeLittle16(&report[7], _sensitivity);
    return report;
}

bool SensorHub::set(std::span<const std::uint8_t> report, std::uint64_t now) noexcept {
    if (report.size() < std::tuple_size_v<FeatureReport> || report[0] != kReportId)
        return false;
    const bool wasOn = isOn();
    const std::uint64_t before = intervalNs();
    _reporting = report[1];
    _power = report[2];
    _intervalMs = Util::loadLittle32(&report[3]);
    _sensitivity = Util::loadLittle16(&report[7]);
    if (!isOn())
        _due.reset();
    else if (!wasOn || intervalNs() != before)
        _due = now + intervalNs();
    return true;
}

void SensorHub::turnOff() noexcept {
    const Acceleration gravity = _gravity;
    *this = SensorHub();
    _gravity = gravity;
}

void SensorHub::bump(const Acceleration &bump, std::uint64_t untilNs) noexcept {
    _bump = bump;
    _bumpUntilNs = untilNs;
}

SensorHub::InputReport SensorHub::inputReport(std::uint64_t now) const noexcept {
    InputReport report{kReportId};
    for (std::size_t axis = 0; axis < _gravity.size(); ++axis) {
        const std::int32_t value = _gravity[axis] + (now < _bumpUntilNs ? _bump[axis] : 0);
        Util::storeLittle32(&report[1 + 4 * axis], static_cast<std::uint32_t>(value));
    }
    return report;
}

void SensorHub::advance(std::uint64_t now) noexcept {
    if (_due)
        *_due += (1 + (now - std::min(now, *_due)) / intervalNs()) * intervalNs();
}

bool SensorHub::isOn() const noexcept { return _reporting == kReportsAll && _power == kFullPower; }

/// An interval of 0 is the fastest it can.
std::uint64_t SensorHub::intervalNs() const noexcept {
    return std::max<std::uint64_t>(_intervalMs, 1) * kNanosecondsPerMs;
}

} // namespace ZorvaTouch::KernelTests
